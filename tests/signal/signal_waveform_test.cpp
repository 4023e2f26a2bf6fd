// Waveform reads and writes through the host's waveform array: the sizing and the cache, the
// driver reading and writing the waveforms' own storage, the stamps, and what the array looks like
// after each failure.
#include "signal/signal_test_support.h"
#include "support/fake_error_log.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

constexpr uint64_t kNow = 30000000;  // 3 s, raw

// The samples of waveform `index`, and its start time (raw) and interval.
std::vector<double> Samples(const SvWaveformArray *array, int32_t index, uint64_t *t0 = nullptr,
                            double *dt = nullptr) {
  std::vector<double> samples(20000);
  SvTime start{};
  samples.resize(std::max(svsimWaveformRead(array, index, samples.data(), 20000, &start, dt), 0));
  if (t0 != nullptr) kvsvSvTimeToRawTime(t0, &start);
  return samples;
}

// The number of samples of each waveform; the array must be unlocked.
std::vector<size_t> Lengths(const SvWaveformArray *array) {
  EXPECT_EQ(svsimWaveformLocked(array), 0);
  std::vector<size_t> lengths;
  for (int32_t i = 0; i < svsimWaveformCount(array); ++i)
    lengths.push_back(Samples(array, i).size());
  return lengths;
}

void FailFirstUnlock() { svsimFailWaveformUnlockAt(1); }

TEST_F(SignalTest, WaveformReadsFillTheWaveformsOrLeaveThemAsEachFailureShould) {
  cFakeErrorLog log;
  const uint32_t reader = Filling("A,B", kvMode_SignalInWaveform);
  // The driver fills the waveforms' own storage and the library stamps them; a steady read costs
  // nothing but the driver's call.
  SvWaveformArray *array = Waveforms(5, 3);  // more waveforms than the session has signals
  for (const uint64_t now : {kNow, kNow + 77}) {
    kvsimSetClock(now);
    svsimResetCounters();
    kvsimLogClear();
    ASSERT_EQ(kvsvReadSignalWaveform(reader, 3, array, now == kNow ? 0.0 : 1.0), 0);
    ASSERT_EQ(Lengths(array), std::vector<size_t>(2, 3));
    for (int32_t i = 0; i < 2; ++i) {
      uint64_t t0 = 0;
      double dt = 0;
      EXPECT_EQ(Samples(array, i, &t0, &dt),
                (std::vector<double>{1000.0 * i, 1000.0 * i + 1, 1000.0 * i + 2}));
      EXPECT_EQ(t0, now);  // one start time and interval for all
      EXPECT_EQ(dt, 1.0 / 1000);
    }
    EXPECT_EQ(Sizes(), std::make_pair(24u, 0u));
    EXPECT_EQ(svsimCleanupRegistrations(), now == kNow ? 0 : 1);  // only for a time limit
  }
  EXPECT_EQ(HostCounts(), std::make_tuple(0, 0, 0));
  EXPECT_EQ(kvsimLogCount(), 1);
  EXPECT_EQ(svsimWaveformCalls(array, 6), 1u);  // the array's Resize, by the first read alone
  // After a read of 4 samples, each case reads again: into a new array, which the read sizes, or
  // into the same one where the case reports an internal error.
  const auto failDriver = [] { kvsimFailCall("kvhdnReadSignalWaveform", kDriverFault, 1); };
  const struct {
    const char *what;
    void (*arm)();
    int32_t fill, numSamples;  // samples the driver has, and asked for
    double timeout;
    kvsvStatus status;
    size_t count, samples;  // the array afterwards
    uint32_t driverSize;    // bytes per buffer the driver got; 0: no driver call
    uint32_t line;          // of the internal error reported; 0: none
  } cases[] = {
      {"a short read cuts the waveforms", NoFailure, 3, 5, 0.0, 0, 2, 3, 40, 0},
      {"-1 without a time limit asks for 10000", NoFailure, 7, -1, 0.0, 0, 2, 7, 80000, 0},
      {"-1 with a time limit", NoFailure, 9, -1, 0.5, kvErrInvalidTimeout, 0, 0, 0, 0},
      {"signal count", FailSignalCount, 9, 4, 0.0, kDriverFault, 0, 0, 0, 0},
      {"resize refused", FailFirstAllocation, 9, 4, 0.0, kvErrOutputMemory, 0, 0, 0, 0},
      {"lock refused", FailFirstLock, 9, 4, 0.0, kvErrOutputMemory, 2, 0, 0, 0},
      {"cutting a short read", FailFirstResize, 2, 4, 0.0, kvErrInternal, 2, 4, 32, 464},
      {"the unlock", FailFirstUnlock, 9, 4, 0.0, kvErrInternal, 2, 4, 32, 490},
      {"driver fails", failDriver, 9, 4, 0.0, kDriverFault, 2, 0, 32, 0},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    ASSERT_EQ(kvsimSetSignalReadFill(reader, 9), 0);
    ASSERT_EQ(kvsvReadSignalWaveform(reader, 4, array, 0.0), 0);
    if (c.line == 0) array = Waveforms();
    const size_t records = log.Records().size();
    ASSERT_EQ(kvsimSetSignalReadFill(reader, c.fill), 0);
    kvsimLogClear();
    c.arm();
    EXPECT_EQ(kvsvReadSignalWaveform(reader, c.numSamples, array, c.timeout), c.status);
    EXPECT_EQ(Lengths(array), std::vector<size_t>(c.count, c.samples));
    const bool read = kvsimCountCalls("kvhdnReadSignalWaveform") == 1;
    EXPECT_EQ(read ? LastCall("kvhdnReadSignalWaveform").size1 : 0u, c.driverSize);
    // Each of these leaves the cache unmatched: the next read sizes the array again.
    EXPECT_EQ(Slot(reader)->cachedSamples, kUnknown);
    EXPECT_EQ(log.Records().size() == records ? 0u : log.Records().back().value.Line(), c.line);
    strayUnlocks_ += c.arm == FailFirstLock ? 1 : 0;  // the host takes the Unlock all the same
  }
}

// A second array of as many waveforms, each shorter than the read, matches the session's cache:
// its waveforms are sized before the driver fills them.
TEST_F(SignalTest, WaveformReadSizesAnotherArrayOfShorterWaveformsBeforeTheDriverFillsIt) {
  const uint32_t reader = Filling("A,B", kvMode_SignalInWaveform);
  ASSERT_EQ(kvsvReadSignalWaveform(reader, 3, Waveforms(2, 3), 0.0), 0);
  SvWaveformArray *shorter = Waveforms(2, 1);
  ASSERT_EQ(kvsvReadSignalWaveform(reader, 3, shorter, 0.0), 0);
  ASSERT_EQ(Lengths(shorter), std::vector<size_t>(2, 3));
  EXPECT_EQ(Samples(shorter, 1), (std::vector<double>{1000.0, 1001.0, 1002.0}));
  EXPECT_EQ(svsimWaveformCalls(shorter, 6), 1u);
}

TEST_F(SignalTest, WaveformWritesCutEveryWaveformToTheShortestAndFailuresForgetTheCount) {
  cFakeErrorLog log;
  const uint32_t writer = MakeSession("A,B,C", kvMode_SignalOutWaveform);
  const auto failDriver = [] { kvsimFailCall("kvhdnWriteSignalWaveform", kDriverFault, 1); };
  const struct {
    std::vector<int32_t> lengths;  // of the waveforms; sample k of waveform i is 10 i + k
    void (*arm)();
    kvsvStatus status;
    uint32_t bufferSize = 0;        // given to the driver
    std::vector<double> sent = {};  // the last sample of each waveform that reached the network
  } cases[] = {
      {{10, 7, 9}, NoFailure, 0, 56, {6, 16, 26}},
      {{4, 0, 4}, NoFailure, 0, 0, {6, 16, 26}},  // nothing sent: the values before stay
      {{3, 3}, NoFailure, kvErrElementCountMismatch},
      {{3, 3, 3}, FailSignalCount, kDriverFault},
      {{3, 3, 3}, FailFirstLock, kvErrOutOfMemory},
      {{3, 3, 3}, failDriver, kDriverFault, 24},
      {{3, 3, 3}, FailFirstUnlock, kvErrInternal, 24},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.lengths.size() << " waveforms, status " << c.status);
    SvWaveformArray *array = Waveforms(static_cast<int32_t>(c.lengths.size()), 0);
    for (size_t i = 0; i < c.lengths.size(); ++i) {
      std::vector<double> samples;
      for (int32_t k = 0; k < c.lengths[i]; ++k) samples.push_back(10.0 * i + k);
      ASSERT_EQ(svsimWaveformWrite(array, static_cast<int32_t>(i), samples.data(), c.lengths[i]),
                0);
    }
    kvsimLogClear();
    const size_t records = log.Records().size();
    c.arm();
    EXPECT_EQ(kvsvWriteSignalWaveform(writer, array, 2.0), c.status);
    EXPECT_EQ(Slot(writer)->cachedCount, c.status == 0 ? 3 : kUnknown);
    const bool written = kvsimCountCalls("kvhdnWriteSignalWaveform") == 1;
    EXPECT_EQ(written, c.status == 0 || c.bufferSize != 0);
    EXPECT_EQ(written ? LastCall("kvhdnWriteSignalWaveform").size1 : 0u, c.bufferSize);
    EXPECT_EQ(log.Records().size() == records ? 0u : log.Records().back().value.Line(),
              c.status == kvErrInternal ? 4392u : 0u);
    strayUnlocks_ += c.arm == FailFirstLock ? 1 : 0;
    if (c.status != 0) continue;
    std::vector<double> sent(3);
    kvsimGetSignalValues(writer, sent.data(), 3);
    EXPECT_EQ(sent, c.sent);
    // The second write of the same count finds it known: no property read.
    EXPECT_EQ(kvsimLogCount(), &c == cases ? 2 : 1);
  }
  // The writes with a time limit that reached the driver registered the abort.
  EXPECT_EQ(svsimCleanupRegistrations(), 4);
  EXPECT_EQ(kvsvWriteSignalWaveform(writer, nullptr, 0.0), kvErrNullArgument);
}

}  // namespace
