// What kvsvReadStateFlexRayTime keeps in the slot between calls: the bus's timing, worked out
// once for each start of the bus. A malloc block at tSessionSlot::flexRayTimeCache.
#ifndef KVSVAPI_STATE_FLEXRAY_TIME_CACHE_H
#define KVSVAPI_STATE_FLEXRAY_TIME_CACHE_H

#include <cstdint>

namespace nKVSVAPI100 {

struct tFlexRayTimeCache {
  uint64_t startTime;      // the bus start time the rest belongs to; 0: empty
  uint64_t cycleZeroTime;  // raw time from which whole cycles are counted
  uint32_t cycleTime;      // length of a cycle in raw time units
  uint32_t macrotickTime;  // length of a macrotick in raw time units
  uint8_t firstCycle;      // cycle number at cycleZeroTime
};
static_assert(sizeof(tFlexRayTimeCache) == 32, "one 32-byte block");

}  // namespace nKVSVAPI100

#endif
