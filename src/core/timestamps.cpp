#include "core/timestamps.h"

namespace nKVSVAPI100 {

namespace {

using namespace nTime;

// The same boundary in SvTime seconds, for the way back.
constexpr int64_t kSvAbsoluteSeconds = 2303704800;
// Half of a unit's fraction, rounded down: a remainder above it rounds up.
constexpr uint64_t kFractionRawHalf = 922337203685;
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
