// The driver's 100 ns and 1 ns times and the host's SvTime, converted in integer arithmetic.
#ifndef KVSVAPI_CORE_TIMESTAMPS_H
#define KVSVAPI_CORE_TIMESTAMPS_H

#include <cstdint>

#include "kvsvapi.h"

namespace nKVSVAPI100 {

namespace nTime {

constexpr uint64_t kRawPerSecond = 10000000;
constexpr uint64_t kNsPerSecond = 1000000000;
// 1601-01-01 to 1904-01-01 in 100 ns units.
constexpr uint64_t kRawEpochShift = 95616288000000000;
// Larger rawTime values are absolute; this one and below are durations, kept small.
constexpr uint64_t kRawRelativeLimit = 118653335999999999;
// 1904-01-01 to 1970-01-01 in 1 ns units.
constexpr uint64_t kNsEpochShift = 2082844800000000000;
// 2^64 / 10^7 rounded up: one 100 ns unit as a fraction of a second.
constexpr uint64_t kFractionPerRaw = 1844674407371;
// 2^64 / 10^9 rounded up.
constexpr uint64_t kFractionPerNs = 18446744074;

}  // namespace nTime

// Inline, since every frame and sample read converts its time in the walk.
inline void RawTimeToSvTime(SvTime *result, const uint64_t *value) {
  uint64_t v = *value;
  if (v == 0) {
    result->fraction = 0;
    result->seconds = 0;
    return;
  }
  if (v > nTime::kRawRelativeLimit) v -= nTime::kRawEpochShift;
  result->seconds = static_cast<int64_t>(v / nTime::kRawPerSecond);
  result->fraction = (v % nTime::kRawPerSecond) * nTime::kFractionPerRaw;
}

inline void NsTimeToSvTime(SvTime *result, const uint64_t *value) {
  if (*value == 0) {
    result->fraction = 0;
    result->seconds = 0;
    return;
  }
  // Every non-zero 1 ns time is absolute; the shift wraps for the largest values.
  const uint64_t v = *value + nTime::kNsEpochShift;
  result->seconds = static_cast<int64_t>(v / nTime::kNsPerSecond);
  result->fraction = (v % nTime::kNsPerSecond) * nTime::kFractionPerNs;
}

void SvTimeToRawTime(uint64_t *result, const SvTime *value);
void SvTimeToNsTime(uint64_t *result, const SvTime *value);

}  // namespace nKVSVAPI100

#endif
