// Waveform reads and writes through the host's waveform array: the sizing and the cache, the
// driver writing into the waveforms' own storage, the stamps, and what the array looks like after
// each failure. The host stand-in stops the process on a Lock without its Unlock.
#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <iterator>
#include <vector>

#include "signal/signal_test_support.h"
#include "support/fake_error_log.h"
#include "support/slot_fixture.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

constexpr uint64_t kNow = 30000000;  // 3 s, raw
constexpr int32_t kResize = 6;       // the position of the array's Resize

struct tWaveform {
  std::vector<double> samples;
  uint64_t t0;  // raw
  double dt;
};

tWaveform ReadWaveform(const SvWaveformArray *array, int32_t index) {
  std::vector<double> samples(20000);
  SvTime t0{};
  tWaveform waveform;
  const int32_t count = svsimWaveformRead(array, index, samples.data(), 20000, &t0, &waveform.dt);
  samples.resize(static_cast<size_t>(std::max(count, 0)));
  waveform.samples = samples;
  waveform.t0 = RawTime(t0);
  return waveform;
}

// What a filled read gives signal i: value 1000 i + k for sample k.
std::vector<double> Filled(uint32_t signal, uint32_t samples) {
  std::vector<double> values;
  for (uint32_t k = 0; k < samples; ++k) values.push_back(1000.0 * signal + k);
  return values;
}

void FailDriverRead() { kvsimFailCall("kvhdnReadSignalWaveform", kDriverFault, 1); }
void FailDriverWrite() { kvsimFailCall("kvhdnWriteSignalWaveform", kDriverFault, 1); }

class WaveformTest : public SlotFixture {
 protected:
  void TearDown() override {
    for (SvWaveformArray *array : arrays_) svsimDisposeWaveformArray(array);
    EXPECT_EQ(svsimStrayWaveformUnlocks(), strayUnlocks_);
    SlotFixture::TearDown();
  }
  SvWaveformArray *Array(int32_t count = 0, int32_t samples = 0) {
    arrays_.push_back(svsimMakeWaveformArray(count, samples));
    return arrays_.back();
  }

  std::vector<SvWaveformArray *> arrays_;
  uint64_t strayUnlocks_ = 0;  // unlocks after a failed Lock that a test expects
};

class SignalWaveformRead : public WaveformTest {
 protected:
  void SetUp() override {
    WaveformTest::SetUp();
    session_ = MakeSession("A,B", kvMode_SignalInWaveform);
    ASSERT_EQ(kvsimSetSignalReadFill(session_, INT32_MAX), 0);
    kvsimSetClock(kNow);
    array_ = Array();
  }
  kvsvStatus Read(int32_t samples, double timeout = 0.0) {
    return kvsvReadSignalWaveform(session_, samples, array_, timeout);
  }
  void ExpectShape(int32_t count, int32_t samples, const char *what = "") {
    ASSERT_EQ(svsimWaveformCount(array_), count) << what;
    for (int32_t i = 0; i < count; ++i) {
      EXPECT_EQ(ReadWaveform(array_, i).samples.size(), static_cast<size_t>(samples)) << what;
    }
    EXPECT_EQ(svsimWaveformLocked(array_), 0) << what;
  }

  uint32_t session_ = 0;
  SvWaveformArray *array_ = nullptr;
};

TEST_F(SignalWaveformRead, TheDriverFillsTheWaveformsAndSteadyReadsCostNothing) {
  ASSERT_EQ(Read(5), 0);
  ExpectShape(2, 5);
  for (int32_t i = 0; i < 2; ++i) {
    const tWaveform waveform = ReadWaveform(array_, i);
    EXPECT_EQ(waveform.samples, Filled(static_cast<uint32_t>(i), 5));
    EXPECT_EQ(waveform.t0, kNow);  // one start time and interval for all
    EXPECT_EQ(waveform.dt, 1.0 / 1000);
  }
  EXPECT_EQ(LastCall("kvhdnReadSignalWaveform").size1, 40u);
  EXPECT_EQ(svsimCleanupRegistrations(), 0);
  const uint64_t resizes = svsimWaveformCalls(array_, kResize);
  svsimResetCounters();
  kvsimLogClear();
  kvsimSetClock(kNow + 77);
  for (int i = 0; i < 3; ++i) ASSERT_EQ(Read(5, 1.0), 0);
  EXPECT_EQ(svsimCleanupRegistrations(), 3);
  EXPECT_EQ(svsimWaveformCalls(array_, kResize), resizes);
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
  EXPECT_EQ(kvsimLogCount(), 3);
  EXPECT_EQ(ReadWaveform(array_, 1).t0, kNow + 77);
}

TEST_F(SignalWaveformRead, SampleCountsAndSignalCountsSizeTheArray) {
  struct Case {
    const char *what;
    int32_t fill;        // samples the driver has
    int32_t numSamples;  // asked for
    double timeout;
    kvsvStatus status;
    int32_t count, samples;  // the array afterwards
    uint32_t driverSize;     // bytes per buffer the driver got; 0: no driver call
  } cases[] = {
      {"a short read cuts the waveforms", 3, 5, 0.0, 0, 2, 3, 40},
      {"-1 without a time limit asks for 10000", 7, -1, 0.0, 0, 2, 7, 80000},
      {"-1 with a time limit is refused", INT32_MAX, -1, 0.5, kvErrInvalidTimeout, 0, 0, 0},
      {"NaN is a time limit", INT32_MAX, -1, std::nan(""), kvErrInvalidTimeout, 0, 0, 0},
  };
  for (const Case &c : cases) {
    ASSERT_EQ(kvsimSetSignalReadFill(session_, c.fill), 0);
    kvsimLogClear();
    EXPECT_EQ(Read(c.numSamples, c.timeout), c.status) << c.what;
    ExpectShape(c.count, c.samples, c.what);
    EXPECT_EQ(kvsimCountCalls("kvhdnReadSignalWaveform"), c.driverSize != 0 ? 1 : 0) << c.what;
    if (c.driverSize != 0) {
      EXPECT_EQ(LastCall("kvhdnReadSignalWaveform").size1, c.driverSize) << c.what;
    }
    // Each of these leaves the cache unmatched: the next read sizes the array again.
    EXPECT_EQ(Slot(session_)->cachedSamples, kUnknown) << c.what;
  }
}

TEST_F(SignalWaveformRead, TheArrayFollowsTheSessionsSignals) {
  SvWaveformArray *wide = Array(5, 3);
  ASSERT_EQ(kvsvReadSignalWaveform(session_, 3, wide, 0.0), 0);
  EXPECT_EQ(svsimWaveformCount(wide), 2);
  const uint32_t none = MakeSession("", kvMode_SignalInWaveform);
  for (int call = 0; call < 2; ++call) {
    ASSERT_EQ(kvsvReadSignalWaveform(none, 4, array_, 0.0), 0);
    ExpectShape(0, 0);
    EXPECT_EQ(Slot(none)->cachedSamples, kUnknown);  // each call sizes again
  }
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 3);
}

TEST_F(SignalWaveformRead, FailuresLeaveTheArrayAsTheyShould) {
  struct Case {
    const char *what;
    void (*arm)();
    kvsvStatus status;
    int32_t count, samples;  // the array afterwards
    bool driverCalled, countForgotten;
    uint64_t strayUnlocks;
  } cases[] = {
      {"signal count", FailSignalCount, kDriverFault, 0, 0, false, false, 0},
      {"resize refused", FailFirstAllocation, kvErrOutputMemory, 0, 0, false, true, 0},
      {"lock refused", FailFirstLock, kvErrOutputMemory, 2, 0, false, false, 1},
      {"driver fails", FailDriverRead, kDriverFault, 2, 0, true, false, 0},
  };
  for (const Case &c : cases) {
    // A read that succeeds, then a new array: its count sends the next read to the sizing.
    ASSERT_EQ(Read(4), 0) << c.what;
    array_ = Array();
    const int32_t driverReads = kvsimCountCalls("kvhdnReadSignalWaveform");
    const uint64_t stray = svsimStrayWaveformUnlocks();
    c.arm();
    EXPECT_EQ(Read(4), c.status) << c.what;
    ExpectShape(c.count, c.samples, c.what);
    EXPECT_EQ(kvsimCountCalls("kvhdnReadSignalWaveform") - driverReads, c.driverCalled ? 1 : 0)
        << c.what;
    EXPECT_EQ(svsimStrayWaveformUnlocks() - stray, c.strayUnlocks) << c.what;
    EXPECT_EQ(Slot(session_)->cachedSamples, kUnknown) << c.what;
    EXPECT_EQ(Slot(session_)->cachedCount == kUnknown, c.countForgotten) << c.what;
    strayUnlocks_ += c.strayUnlocks;
  }
  // What the driver left of the stamps is stored: nothing, so zero time and no interval.
  EXPECT_EQ(ReadWaveform(array_, 0).t0, 0u);
  EXPECT_EQ(ReadWaveform(array_, 0).dt, 0.0);
  ASSERT_EQ(Read(4), 0);
  ExpectShape(2, 4);
}

TEST_F(SignalWaveformRead, HostFailuresAfterTheDriverAreInternalErrors) {
  kvsvtest::cFakeErrorLog log;
  struct Case {
    const char *what;
    void (*arm)();
    int32_t fill;
    uint32_t line;
  } cases[] = {{"cutting a short read", [] { svsimFailResizeAt(1); }, 2, 464},
               {"the unlock", [] { svsimFailWaveformUnlockAt(1); }, INT32_MAX, 490}};
  for (const Case &c : cases) {
    ASSERT_EQ(Read(4), 0) << c.what;
    ASSERT_EQ(kvsimSetSignalReadFill(session_, c.fill), 0);
    c.arm();
    EXPECT_EQ(Read(4), kvErrInternal) << c.what;
    ASSERT_FALSE(log.Records().empty());
    EXPECT_EQ(log.Records().back().value.File(), 9u) << c.what;
    EXPECT_EQ(log.Records().back().value.Line(), c.line) << c.what;
    EXPECT_EQ(svsimWaveformLocked(array_), 0) << c.what;
    ASSERT_EQ(kvsimSetSignalReadFill(session_, INT32_MAX), 0);
  }
}

class SignalWaveformWrite : public WaveformTest {
 protected:
  void SetUp() override {
    WaveformTest::SetUp();
    writer_ = MakeSession("A,B,C", kvMode_SignalOutWaveform);
  }
  // An array of one waveform per length, sample k of waveform i being 10 i + k.
  SvWaveformArray *Waveforms(const std::vector<int32_t> &lengths) {
    SvWaveformArray *array = Array(static_cast<int32_t>(lengths.size()), 0);
    for (size_t i = 0; i < lengths.size(); ++i) {
      std::vector<double> samples;
      for (int32_t k = 0; k < lengths[i]; ++k) samples.push_back(10.0 * i + k);
      EXPECT_EQ(svsimWaveformWrite(array, static_cast<int32_t>(i), samples.data(), lengths[i]), 0);
    }
    return array;
  }
  // The last sample of each waveform that the driver took, as it left it on the network.
  std::vector<double> Sent() {
    std::vector<double> values(3);
    kvsimGetSignalValues(writer_, values.data(), 3);
    return values;
  }

  uint32_t writer_ = 0;
};

TEST_F(SignalWaveformWrite, EveryWaveformIsCutToTheShortestAndSteadyWritesCostNothing) {
  struct Case {
    std::vector<int32_t> lengths;
    uint32_t bufferSize;
    std::vector<double> sent;
  } cases[] = {{{10, 7, 9}, 56, {6, 16, 26}},
               {{4, 0, 4}, 0, {6, 16, 26}}};  // nothing sent: the values before stay
  for (const Case &c : cases) {
    SvWaveformArray *array = Waveforms(c.lengths);
    ASSERT_EQ(kvsvWriteSignalWaveform(writer_, array, 2.0), 0);
    EXPECT_EQ(LastCall("kvhdnWriteSignalWaveform").size1, c.bufferSize);
    EXPECT_EQ(Sent(), c.sent);
    EXPECT_EQ(svsimWaveformLocked(array), 0);
    svsimResetCounters();
    kvsimLogClear();
    ASSERT_EQ(kvsvWriteSignalWaveform(writer_, array, 0.0), 0);
    EXPECT_EQ(kvsimLogCount(), 1);  // no property read
    EXPECT_EQ(svsimAllocCount() + svsimResizeCount(), 0u);
  }
  EXPECT_EQ(svsimCleanupRegistrations(), 2);
  // Without waveforms the count stays at its start, and its bytes wrap.
  const uint32_t none = MakeSession("", kvMode_SignalOutWaveform);
  ASSERT_EQ(kvsvWriteSignalWaveform(none, Array(), 0.0), 0);
  EXPECT_EQ(LastCall("kvhdnWriteSignalWaveform").size1, 0xFFFFFFF8u);
}

TEST_F(SignalWaveformWrite, FailuresForgetTheSignalCount) {
  struct Case {
    std::vector<int32_t> lengths;
    void (*arm)();
    kvsvStatus status;
    int32_t driverCalls;
    uint64_t strayUnlocks;
  } cases[] = {
      {{3, 3}, NoFailure, kvErrElementCountMismatch, 0, 0},  // two waveforms for three signals
      {{3, 3, 3}, FailSignalCount, kDriverFault, 0, 0},
      {{3, 3, 3}, FailFirstLock, kvErrOutOfMemory, 0, 1},
      {{3, 3, 3}, FailDriverWrite, kDriverFault, 1, 0},
  };
  for (size_t i = 0; i < std::size(cases); ++i) {
    const Case &c = cases[i];
    SvWaveformArray *array = Waveforms(c.lengths);
    const int32_t driverWrites = kvsimCountCalls("kvhdnWriteSignalWaveform");
    const uint64_t stray = svsimStrayWaveformUnlocks();
    c.arm();
    EXPECT_EQ(kvsvWriteSignalWaveform(writer_, array, 0.0), c.status) << i;
    EXPECT_EQ(kvsimCountCalls("kvhdnWriteSignalWaveform") - driverWrites, c.driverCalls) << i;
    EXPECT_EQ(svsimStrayWaveformUnlocks() - stray, c.strayUnlocks) << i;
    EXPECT_EQ(Slot(writer_)->cachedCount, kUnknown) << i;
    EXPECT_EQ(svsimWaveformLocked(array), 0) << i;
    strayUnlocks_ += c.strayUnlocks;
  }
  kvsvtest::cFakeErrorLog log;
  SvWaveformArray *array = Waveforms({2, 2, 2});
  ASSERT_EQ(kvsvWriteSignalWaveform(writer_, array, 0.0), 0);
  svsimFailWaveformUnlockAt(1);
  EXPECT_EQ(kvsvWriteSignalWaveform(writer_, array, 0.0), kvErrInternal);
  ASSERT_EQ(log.Records().size(), 1u);
  EXPECT_EQ(log.Records()[0].value.Line(), 4392u);
  EXPECT_EQ(kvsvWriteSignalWaveform(writer_, nullptr, 0.0), kvErrNullArgument);
}

}  // namespace
