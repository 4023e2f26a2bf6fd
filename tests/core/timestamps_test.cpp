// The three forms of time: the driver's 100 ns and 1 ns counts and the host's SvTime, through the
// helpers and through every export name that stands for them.
#include "core/timestamps.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

#include "kvsvapi.h"

namespace {

using namespace nKVSVAPI100;

constexpr uint64_t kOnes = UINT64_MAX, kRawLimit = 118653335999999999;  // largest relative time
constexpr uint64_t kPerRaw = 1844674407371, kRawHalf = 922337203685;
constexpr uint64_t kPerNs = 18446744074, kNsHalf = 9223372037, kNsShift = 2082844800000000000;

using tToSv = void (*)(SvTime *, uint64_t);
using tFromSv = void (*)(uint64_t *, const SvTime *);
void RawToSv(SvTime *result, uint64_t value) { RawTimeToSvTime(result, &value); }
void NsToSv(SvTime *result, uint64_t value) { NsTimeToSvTime(result, &value); }

// Which way a case holds: to SvTime, from SvTime, or both.
enum eWay { kTo = 1, kFrom = 2, kBoth = 3 };
struct tCase {
  uint64_t value;
  int64_t seconds;
  uint64_t fraction;
  int way;
};

void Check(const std::vector<tToSv> &tos, const std::vector<tFromSv> &froms,
           const std::vector<tCase> &cases) {
  for (const tCase &c : cases) {
    SCOPED_TRACE(testing::Message() << c.value << " " << c.seconds << " " << c.fraction);
    for (size_t i = 0; i < tos.size() && (c.way & kTo) != 0; ++i) {
      SvTime t{0xDEAD, -77};
      tos[i](&t, c.value);
      EXPECT_EQ(t.seconds, c.seconds) << "form " << i;
      EXPECT_EQ(t.fraction, c.fraction) << "form " << i;
    }
    for (size_t i = 0; i < froms.size() && (c.way & kFrom) != 0; ++i) {
      const SvTime t{c.fraction, c.seconds};
      uint64_t value = 0xDEAD;
      froms[i](&value, &t);
      EXPECT_EQ(value, c.value) << "form " << i;
    }
  }
}

// The largest relative raw time is not shifted, the next value is the first absolute one, and a
// relative time whose seconds reach the boundary reads back as that absolute time. Negative
// seconds give no time. A remainder of exactly half a step rounds down; all ones carries into the
// next second, and across the boundary the value is still taken as unshifted.
TEST(RawTime, ConvertsBothWaysShiftingAbsoluteTimesAndRoundingToTheNearestStep) {
  Check({&RawToSv, &kvsvRawTimeToSvTime, &kvsv100nsTimeToSvTime},
        {&SvTimeToRawTime, &kvsvSvTimeToRawTime, &kvsvSvTimeTo100nsTime},
        {{0, 0, 0, kBoth},
         {1, 0, kPerRaw, kBoth},
         {9999999, 0, 9999999 * kPerRaw, kBoth},
         {kRawLimit, 11865333599, 18446742229035592629u, kTo},
         {kRawLimit + 1, 2303704800, 0, kBoth},
         {23037048000000000, 2303704800, 0, kTo},
         {23037047990000000, 2303704799, 0, kBoth},
         {kOnes, 1835112778570, 17619619739560954165u, kTo},
         {0, -1, kOnes, kFrom},
         {50000001, 5, kPerRaw + kRawHalf, kFrom},
         {50000002, 5, kPerRaw + kRawHalf + 1, kFrom},
         {23037048000000000, 2303704799, kOnes, kFrom}});
}

// The largest counts land before 1970, and one wraps to exactly zero, no time at all. Negative
// seconds are not caught; only the all-zero SvTime is no time.
TEST(NsTime, ConvertsBothWaysFrom1970WrappingIn64Bits) {
  Check({&NsToSv, &kvsv1nsTimeToSvTime}, {&SvTimeToNsTime, &kvsvSvTimeTo1nsTime},
        {{0, 0, 0, kBoth},
         {1, 2082844800, kPerNs, kBoth},
         {1700000000123456789, 3782844800, 123456789 * kPerNs, kBoth},
         {kOnes, 2082844799, 18446744055553255926u, kBoth},
         {0 - kNsShift, 0, 0, kTo},
         {0, 2082844800, kNsHalf, kFrom},
         {1, 2082844800, kNsHalf + 1, kFrom},
         {1000000000, 2082844800, kOnes, kFrom},
         {16363899272709551616u, -1, 0, kFrom},
         {1 - kNsShift, 0, kPerNs, kFrom}});
}

TEST(TimeExports, NullResultsAreIgnoredAndNullInputsReadAsNoTime) {
  kvsvRawTimeToSvTime(nullptr, 123);
  kvsv1nsTimeToSvTime(nullptr, 123);
  kvsvSvTimeToRawTime(nullptr, nullptr);
  kvsvSvTimeTo1nsTime(nullptr, nullptr);
  uint64_t raw = 77, ns = 77;
  kvsvSvTimeToRawTime(&raw, nullptr);
  kvsvSvTimeTo1nsTime(&ns, nullptr);
  EXPECT_EQ(raw + ns, 0u);
}

}  // namespace
