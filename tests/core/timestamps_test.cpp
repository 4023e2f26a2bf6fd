// The three forms of time: the driver's 100 ns and 1 ns counts and the host's SvTime.
#include "core/timestamps.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <iterator>
#include <random>

#include "kvsvapi.h"

namespace {

using namespace nKVSVAPI100;

constexpr uint64_t kOnes = UINT64_MAX;
constexpr uint64_t kFractionPerRaw = 1844674407371;
constexpr uint64_t kRawHalf = 922337203685;
constexpr uint64_t kFractionPerNs = 18446744074;
constexpr uint64_t kNsHalf = 9223372037;
constexpr uint64_t kRawShift = 95616288000000000;
constexpr uint64_t kRawRelativeLimit = 118653335999999999;
constexpr uint64_t kNsShift = 2082844800000000000;

// The helpers and each export name that stands for them.
using tToSv = void (*)(SvTime *, uint64_t);
using tFromSv = void (*)(uint64_t *, const SvTime *);

void RawHelperToSv(SvTime *result, uint64_t value) { RawTimeToSvTime(result, &value); }
void NsHelperToSv(SvTime *result, uint64_t value) { NsTimeToSvTime(result, &value); }

const tToSv kRawToSv[] = {&RawHelperToSv, &kvsvRawTimeToSvTime, &kvsv100nsTimeToSvTime};
const tFromSv kSvToRaw[] = {&SvTimeToRawTime, &kvsvSvTimeToRawTime, &kvsvSvTimeTo100nsTime};
const tToSv kNsToSv[] = {&NsHelperToSv, &kvsv1nsTimeToSvTime};
const tFromSv kSvToNs[] = {&SvTimeToNsTime, &kvsvSvTimeTo1nsTime};

struct tToSvCase {
  uint64_t value;
  int64_t seconds;
  uint64_t fraction;
};

struct tFromSvCase {
  int64_t seconds;
  uint64_t fraction;
  uint64_t value;
};

template <size_t N>
void CheckToSv(const tToSv (&forms)[N], const tToSvCase *cases, size_t count) {
  for (tToSv form : forms) {
    for (size_t i = 0; i < count; ++i) {
      SvTime t{0xDEAD, -77};
      form(&t, cases[i].value);
      EXPECT_EQ(t.seconds, cases[i].seconds) << "value " << cases[i].value;
      EXPECT_EQ(t.fraction, cases[i].fraction) << "value " << cases[i].value;
    }
  }
}

template <size_t N>
void CheckFromSv(const tFromSv (&forms)[N], const tFromSvCase *cases, size_t count) {
  for (tFromSv form : forms) {
    for (size_t i = 0; i < count; ++i) {
      const SvTime t{cases[i].fraction, cases[i].seconds};
      uint64_t value = 0xDEAD;
      form(&value, &t);
      EXPECT_EQ(value, cases[i].value)
          << "seconds " << cases[i].seconds << " fraction " << cases[i].fraction;
    }
  }
}

TEST(RawTime, ToSvTime) {
  const tToSvCase cases[] = {
      {0, 0, 0},
      {1, 0, kFractionPerRaw},
      {10000000, 1, 0},
      {9999999, 0, 9999999 * kFractionPerRaw},
      // The largest relative time is not shifted; the next value is the first absolute one.
      {kRawRelativeLimit, 11865333599, 18446742229035592629u},
      {kRawRelativeLimit + 1, 2303704800, 0},
      {133000000000000000, 3738371200, 0},
      {kOnes, 1835112778570, 17619619739560954165u},
  };
  CheckToSv(kRawToSv, cases, std::size(cases));
}

TEST(RawTime, FromSvTime) {
  const tFromSvCase cases[] = {
      {0, 0, 0},
      {0, kFractionPerRaw, 1},
      // Negative seconds give no time, whatever the fraction.
      {-1, 0, 0},
      {-1, kOnes, 0},
      {INT64_MIN, 12345, 0},
      // The last second before the boundary stays unshifted; the boundary itself is shifted.
      {2303704799, 0, 23037047990000000},
      {2303704800, 0, kRawRelativeLimit + 1},
      {3738371200, 0, 133000000000000000},
      // Rounding to the nearest 100 ns; a remainder of exactly the limit rounds down.
      {0, kRawHalf, 0},
      {0, kRawHalf + 1, 1},
      {5, kFractionPerRaw + kRawHalf, 50000001},
      {5, kFractionPerRaw + kRawHalf + 1, 50000002},
      // All ones rounds up to a whole second and carries into the next.
      {0, kOnes, 10000000},
      {7, kOnes, 80000000},
      // Carried across the boundary, the value is still taken as unshifted.
      {2303704799, kOnes, 23037048000000000},
  };
  CheckFromSv(kSvToRaw, cases, std::size(cases));
}

TEST(NsTime, ToSvTime) {
  const tToSvCase cases[] = {
      {0, 0, 0},
      {1, 2082844800, kFractionPerNs},
      {1000000000, 2082844801, 0},
      {1700000000123456789, 3782844800, 123456789 * kFractionPerNs},
      // The shift wraps in 64 bits: the largest values land before 1970.
      {kOnes, 2082844799, 18446744055553255926u},
      // This one wraps to exactly zero, which reads as no time at all.
      {16363899273709551616u, 0, 0},
  };
  CheckToSv(kNsToSv, cases, std::size(cases));
}

TEST(NsTime, FromSvTime) {
  const tFromSvCase cases[] = {
      {0, 0, 0},
      {2082844800, kFractionPerNs, 1},
      {2082844801, 0, 1000000000},
      {2082844800, kNsHalf, 0},
      {2082844800, kNsHalf + 1, 1},
      {2082844800, kOnes, 1000000000},
      // Negative seconds are not caught: the value wraps as it is.
      {-1, 0, 16363899272709551616u},
      // Only the all-zero SvTime is no time; a zero second with a fraction is a time before 1970.
      {0, kFractionPerNs, 1 - kNsShift},
  };
  CheckFromSv(kSvToNs, cases, std::size(cases));
}

unsigned __int128 Total(const SvTime &t) {
  return (static_cast<unsigned __int128>(static_cast<uint64_t>(t.seconds)) << 64) | t.fraction;
}

unsigned __int128 Distance(const SvTime &a, const SvTime &b) {
  return Total(a) > Total(b) ? Total(a) - Total(b) : Total(b) - Total(a);
}

constexpr int kSamples = 200000;

TEST(RawTime, RoundTripIsExactOutsideTheShiftedRelativeRange) {
  const struct {
    uint64_t low, high, shift;
  } ranges[] = {
      {1, 23037047999999999, 0},
      {kRawRelativeLimit + 1, kOnes, 0},
      // Relative values whose seconds reach the boundary are read back as absolute: shifted by
      // the epoch, the same instant that an absolute time of those seconds stands for.
      {23037048000000000, kRawRelativeLimit, kRawShift},
  };
  std::mt19937_64 random(1601);
  for (const auto &r : ranges) {
    std::uniform_int_distribution<uint64_t> values(r.low, r.high);
    for (int i = 0; i < kSamples; ++i) {
      const uint64_t raw = values(random);
      SvTime t;
      RawTimeToSvTime(&t, &raw);
      uint64_t back = 0;
      SvTimeToRawTime(&back, &t);
      ASSERT_EQ(back, raw + r.shift) << raw;
    }
  }
}

TEST(NsTime, RoundTripIsExactForEveryTimeButTheOneThatWrapsToZero) {
  std::mt19937_64 random(1970);
  for (int i = 0; i < kSamples; ++i) {
    const uint64_t ns = random();
    if (ns == 0 || ns == 0 - kNsShift) continue;
    SvTime t;
    NsTimeToSvTime(&t, &ns);
    uint64_t back = 0;
    SvTimeToNsTime(&back, &t);
    ASSERT_EQ(back, ns);
  }
}

TEST(TimeForms, SvTimeComesBackWithinHalfAStep) {
  const struct {
    const char *step;
    tFromSv from;
    tToSv to;
    int64_t lowSeconds, highSeconds;
    uint64_t half;
  } forms[] = {
      {"100 ns", &SvTimeToRawTime, &RawHelperToSv, 0, 1000000000000, kRawHalf},
      // From 1970 up to where the count of nanoseconds still fits.
      {"1 ns", &SvTimeToNsTime, &NsHelperToSv, 2082844800, 18000000000, kNsHalf},
  };
  std::mt19937_64 random(1904);
  for (const auto &f : forms) {
    SCOPED_TRACE(f.step);
    std::uniform_int_distribution<int64_t> seconds(f.lowSeconds, f.highSeconds);
    for (int i = 0; i < kSamples; ++i) {
      const SvTime t{random(), seconds(random)};
      uint64_t value = 0;
      f.from(&value, &t);
      SvTime back;
      f.to(&back, value);
      ASSERT_LE(Distance(t, back), f.half + 1) << t.seconds << " " << t.fraction;
    }
  }
}

TEST(TimeExports, NullPointersAreIgnoredOrReadAsNoTime) {
  kvsvRawTimeToSvTime(nullptr, 123);
  kvsv1nsTimeToSvTime(nullptr, 123);
  kvsvSvTimeToRawTime(nullptr, nullptr);
  kvsvSvTimeTo1nsTime(nullptr, nullptr);
  uint64_t raw = 77;
  kvsvSvTimeToRawTime(&raw, nullptr);
  EXPECT_EQ(raw, 0u);
  uint64_t ns = 77;
  kvsvSvTimeTo1nsTime(&ns, nullptr);
  EXPECT_EQ(ns, 0u);
}

}  // namespace
