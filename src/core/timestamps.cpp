#include "core/timestamps.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint64_t kRawPerSecond = 10000000;
constexpr uint64_t kNsPerSecond = 1000000000;
// 1601-01-01 to 1904-01-01 in 100 ns units.
constexpr uint64_t kRawEpochShift = 95616288000000000;
// Larger rawTime values are absolute; this one and below are durations, kept small.
constexpr uint64_t kRawRelativeLimit = 118653335999999999;
// The same boundary in SvTime seconds, for the way back.
constexpr int64_t kSvAbsoluteSeconds = 2303704800;
// 1904-01-01 to 1970-01-01 in 1 ns units.
constexpr uint64_t kNsEpochShift = 2082844800000000000;
// 2^64 / 10^7 rounded up, and half of it rounded down: a remainder above that rounds up.
constexpr uint64_t kFractionPerRaw = 1844674407371;
constexpr uint64_t kFractionRawHalf = 922337203685;
// 2^64 / 10^9 rounded up, and half of it.
constexpr uint64_t kFractionPerNs = 18446744074;
constexpr uint64_t kFractionNsHalf = 9223372037;

static_assert(kRawRelativeLimit + 1 - kRawEpochShift == kSvAbsoluteSeconds * kRawPerSecond,
              "the relative limit is the same instant in both directions");
static_assert(kFractionPerRaw <= UINT64_MAX / (kRawPerSecond - 1), "fraction fits in 64 bits");
static_assert(kFractionPerNs <= UINT64_MAX / (kNsPerSecond - 1), "fraction fits in 64 bits");

// Nearest whole unit of a fraction; a remainder of exactly the half rounds down.
uint64_t RoundedUnits(uint64_t fraction, uint64_t perUnit, uint64_t half) {
  uint64_t units = fraction / perUnit;
  if (fraction % perUnit > half) ++units;
  return units;
}

}  // namespace

void RawTimeToSvTime(SvTime *result, const uint64_t *value) {
  uint64_t v = *value;
  if (v == 0) {
    result->fraction = 0;
    result->seconds = 0;
    return;
  }
  if (v > kRawRelativeLimit) v -= kRawEpochShift;
  result->seconds = static_cast<int64_t>(v / kRawPerSecond);
  result->fraction = (v % kRawPerSecond) * kFractionPerRaw;
}

void SvTimeToRawTime(uint64_t *result, const SvTime *value) {
  if (value->seconds < 0) {
    *result = 0;
    return;
  }
  uint64_t raw = RoundedUnits(value->fraction, kFractionPerRaw, kFractionRawHalf) +
                 static_cast<uint64_t>(value->seconds) * kRawPerSecond;
  if (value->seconds >= kSvAbsoluteSeconds) raw += kRawEpochShift;
  *result = raw;
}

void NsTimeToSvTime(SvTime *result, const uint64_t *value) {
  if (*value == 0) {
    result->fraction = 0;
    result->seconds = 0;
    return;
  }
  // Every non-zero 1 ns time is absolute; the shift wraps for the largest values.
  const uint64_t v = *value + kNsEpochShift;
  result->seconds = static_cast<int64_t>(v / kNsPerSecond);
  result->fraction = (v % kNsPerSecond) * kFractionPerNs;
}

void SvTimeToNsTime(uint64_t *result, const SvTime *value) {
  if (value->fraction == 0 && value->seconds == 0) {
    *result = 0;
    return;
  }
  // Negative seconds are not caught: the wrapped value goes to the driver as it is.
  *result = RoundedUnits(value->fraction, kFractionPerNs, kFractionNsHalf) +
            static_cast<uint64_t>(value->seconds) * kNsPerSecond - kNsEpochShift;
}

}  // namespace nKVSVAPI100
