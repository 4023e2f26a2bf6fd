// kvsvWriteStateU32: a 32-bit state value straight to the driver.
#include "kvsvapi.h"
#include "kvsvplatform.h"

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteStateU32(uint32_t session, uint32_t stateId,
                                                    uint32_t value) {
  // No slot and no guard: the driver judges the session and the state.
  return kvWriteState(session, stateId, sizeof value, &value);
}
