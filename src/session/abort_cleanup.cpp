#include "session/abort_cleanup.h"

#include "kvsvapi.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// Written as a negated equality so that NaN, which equals nothing, counts as a limit.
bool MayBlock(double timeLimit) { return !(timeLimit == 0.0); }

void RegisterAbort(uint32_t session) {
  svSetCleanupProc(kvsvSessionAbort, session, kAbortCleanupMode);
}

void RegisterAbortIfBlocking(uint32_t session, double timeLimit) {
  if (MayBlock(timeLimit)) RegisterAbort(session);
}

}  // namespace nKVSVAPI100
