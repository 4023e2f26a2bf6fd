// kvsvSessionWait: waits in the driver for a condition of the session.
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/abort_cleanup.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionWait(uint32_t session, uint32_t condition,
                                                  uint32_t parameter, uint32_t *parameterOut,
                                                  double timeLimit) {
  RegisterAbortIfBlocking(session, timeLimit);
  return kvWait(session, condition, parameter, parameterOut, timeLimit);
}
