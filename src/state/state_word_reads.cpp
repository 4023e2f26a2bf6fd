// kvsvReadStateFlexRayStats and kvsvReadStateU32: states that reach the host as the driver gives
// them, straight into the host's buffer.
#include "kvsvapi.h"
#include "kvsvplatform.h"

namespace {

constexpr uint32_t kFlexRayStatsSize = 24;

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateFlexRayStats(uint32_t session, void *statistics) {
  return kvReadState(session, kvState_FlexRayStats, kFlexRayStatsSize, statistics, nullptr);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateU32(uint32_t session, uint32_t stateId,
                                                   uint32_t *value) {
  return kvReadState(session, stateId, sizeof *value, value, nullptr);
}
