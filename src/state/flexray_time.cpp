// kvsvReadStateFlexRayTime: the current FlexRay cycle and macrotick, from the driver's time now
// and the time the bus started, with the bus's timing kept in the slot for each start.
#include <cstdlib>

#include "core/status.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/slot_guard.h"
#include "state/flexray_time_cache.h"

using namespace nKVSVAPI100;

namespace {

// The driver's hidden FlexRay timing of a session.
constexpr uint32_t kPropTimingKnown = 0x0210FFFA;  // 0 while the driver has no timing
constexpr uint32_t kPropCycleLength = 0x0010FFFE;  // in microseconds: 10 raw time units
constexpr uint32_t kPropMacroticksPerCycle = 0x0010FFFD;
constexpr uint32_t kPropCycleStartOffset = 0x0010FFFA;  // in macroticks
// A fixed correction of the driver's to where cycle 0 begins, in raw time units.
constexpr uint32_t kStartStampDelay = 40;
constexpr uint32_t kCycleCount = 64;

// Keeps the first warning among successes; an error takes over.
Status Merge(Status kept, Status next) { return kept == 0 || next < 0 ? next : kept; }

// Works the timing of the bus that started at `start` out into the cache. On any failure the
// cache is left empty, so that the next call starts again.
Status FillCache(uint32_t session, uint64_t start, tFlexRayTimeCache &cache) {
  cache.startTime = 0;
  uint32_t known = 0;
  Status status = kvGetProperty(session, kPropTimingKnown, sizeof known, &known);
  if (status < 0) return status;
  if (known == 0) return kvErrFlexRayTimeUnknown;
  uint32_t cycleLength = 0;
  uint32_t macroticks = 0;
  status =
      Merge(status, kvGetProperty(session, kPropCycleLength, sizeof cycleLength, &cycleLength));
  if (status < 0) return status;
  status = Merge(status,
                 kvGetProperty(session, kPropMacroticksPerCycle, sizeof macroticks, &macroticks));
  if (status < 0) return status;
  if (cycleLength == 0 || macroticks == 0) return kvErrFlexRayTimeInvalid;
  cache.cycleTime = cycleLength * 10;
  cache.macrotickTime = cache.cycleTime / macroticks;
  // More macroticks than raw time units in a cycle, or a cycle length that wrapped to 0, leave a
  // macrotick of 0: a divisor below that would kill the host, so such a timing is unusable.
  if (cache.macrotickTime == 0) return kvErrFlexRayTimeInvalid;
  uint32_t comm = 0;
  status = Merge(status, kvReadState(session, kvState_FlexRayComm, sizeof comm, &comm, nullptr));
  if (status < 0) return status;
  cache.firstCycle = static_cast<uint8_t>(((comm >> 24) + 1) % kCycleCount);
  uint32_t offset = 0;
  status = Merge(status, kvGetProperty(session, kPropCycleStartOffset, sizeof offset, &offset));
  if (status < 0) return status;
  // The driver's arithmetic is in 32 bits and wraps.
  const uint32_t sinceStart = cache.cycleTime - kStartStampDelay - offset * cache.macrotickTime;
  cache.cycleZeroTime = start + sinceStart;
  cache.startTime = start;
  return status;
}

Status ReadFlexRayTime(uint32_t session, uint8_t &cycle, uint16_t &macrotick) {
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  uint64_t now = 0;
  uint64_t start = 0;
  Status status = kvReadState(session, kvState_TimeCurrent, sizeof now, &now, nullptr);
  if (status < 0) return status;
  status = Merge(status, kvReadState(session, kvState_TimeStart, sizeof start, &start, nullptr));
  if (status < 0) return status;
  if (now == 0 || start == 0) return kvErrFlexRayTimeInvalid;
  if (slot.flexRayTimeCache == nullptr) {
    slot.flexRayTimeCache = std::calloc(1, sizeof(tFlexRayTimeCache));
    if (slot.flexRayTimeCache == nullptr) return kvErrOutOfMemory;
  }
  auto &cache = *static_cast<tFlexRayTimeCache *>(slot.flexRayTimeCache);
  if (start != cache.startTime) {
    status = Merge(status, FillCache(session, start, cache));
    if (status < 0) return status;
  }
  const uint64_t elapsed = now - cache.cycleZeroTime;
  cycle = static_cast<uint8_t>((elapsed / cache.cycleTime + cache.firstCycle) % kCycleCount);
  // The nearest macrotick: half a macrotick up, then whole ones.
  macrotick = static_cast<uint16_t>((cache.macrotickTime / 2 + elapsed % cache.cycleTime) /
                                    cache.macrotickTime);
  return status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateFlexRayTime(uint32_t session, uint8_t *cycle,
                                                           uint16_t *macrotick) {
  if (cycle == nullptr || macrotick == nullptr) return kvErrNullArgument;
  *cycle = 0;
  *macrotick = 0;
  return ReadFlexRayTime(session, *cycle, *macrotick);
}
