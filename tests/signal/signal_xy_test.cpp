// XY reads and writes through the guarded path: the marshalling between the driver's flat regions
// and the host's clusters, the cache that keeps a steady loop free of property reads and
// allocations, and what every failure leaves behind.
#include <gtest/gtest.h>

#include <climits>
#include <vector>

#include "signal/signal_test_support.h"
#include "support/slot_fixture.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

constexpr uint64_t kNow = 20000000;  // 2 s, raw

// What a filled read hands out for signal i: value 1000 i + k, stamped with the clock plus k.
tXY Filled(uint32_t signal, uint32_t pairs) {
  tXY expected;
  for (uint32_t k = 0; k < pairs; ++k) {
    expected.times.push_back(kNow + k);
    expected.values.push_back(1000.0 * signal + k);
  }
  return expected;
}

class SignalXY : public SlotFixture {
 protected:
  void SetUp() override {
    SlotFixture::SetUp();
    session_ = Filling(kvMode_SignalInXY);
    kvsimSetClock(kNow);
  }
  void TearDown() override {
    DisposeClusters(clusters_);
    SlotFixture::TearDown();
  }
  uint32_t Filling(uint32_t mode) {
    const uint32_t session = MakeSession("A,B,C", mode);
    EXPECT_EQ(kvsimSetSignalReadFill(session, INT32_MAX), 0);
    return session;
  }
  kvsvStatus Read(int32_t samples, const SvTime *limit = nullptr) {
    return kvsvReadSignalXY(session_, samples, limit, &clusters_);
  }
  void ExpectFilled(uint32_t pairs) {
    const std::vector<tXY> read = ReadClusters(clusters_);
    ASSERT_EQ(read.size(), 3u);
    for (uint32_t i = 0; i < 3; ++i) EXPECT_TRUE(read[i] == Filled(i, pairs)) << i;
  }

  uint32_t session_ = 0;
  SvHandle clusters_ = nullptr;
};

TEST_F(SignalXY, ReadsFillOneClusterPerSignalAndSteadyOnesCostNothing) {
  ASSERT_EQ(kvsimSetSignalReadFill(session_, 3), 0);  // the driver gives 3 of a run of 4
  ASSERT_EQ(Read(4), 0);
  ExpectFilled(3);
  EXPECT_EQ(svGetHandleSize(clusters_), 3u * 16 + 8);
  EXPECT_EQ(svGetHandleSize(*Element(clusters_, 2, true)), 4u * 8 + 8);
  EXPECT_EQ(svGetHandleSize(*Element(clusters_, 2, false)), 4u * 16 + 8);
  EXPECT_EQ(LastCall("kvReadSignalXY").size1, 3u * 4 * 8);  // the timestamps' region is as large
  EXPECT_EQ(LastCall("kvReadSignalXY").size2, 3u * 4);
  EXPECT_EQ(Slot(session_)->frameBufferSize, (4u * 16 + 4) * 3);
  svsimResetCounters();
  kvsimLogClear();
  for (int i = 0; i < 3; ++i) ASSERT_EQ(Read(4), 0);
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
  EXPECT_EQ(kvsimLogCount(), 3);  // the driver read and nothing else
}

TEST_F(SignalXY, SampleCountsOfZeroAndBelow) {
  const uint32_t single = Filling(kvMode_SignalInSinglePoint);
  uint32_t queue = 6;
  ASSERT_EQ(kvSetProperty(session_, kvPropSession_QueueSize, 4, &queue), 0);
  ASSERT_EQ(Read(0), 0);  // passed on: two empty regions and the pair counts
  EXPECT_EQ(LastCall("kvReadSignalXY").size1, 0u);
  EXPECT_EQ(LastCall("kvReadSignalXY").size2, 12u);
  // A negative count stands for the queue size, read once for the life of the slot.
  for (uint32_t later : {9u, 12u}) {
    ASSERT_EQ(Read(-1), 0);
    EXPECT_EQ(LastCall("kvReadSignalXY").size1, 3u * 6 * 8);
    ASSERT_EQ(kvSetProperty(session_, kvPropSession_QueueSize, 4, &later), 0);
  }
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_QueueSize), 1);
  // Any other mode reads one value per signal with its time; 0 sizes again on every call.
  SvHandle clusters = nullptr;
  for (int32_t samples : {0, 0, 7}) {
    ASSERT_EQ(kvsvReadSignalXY(single, samples, nullptr, &clusters), 0);
    EXPECT_EQ(LastCall("kvReadSignalSinglePoint").size2, 24u);
    const std::vector<tXY> read = ReadClusters(clusters);
    for (uint32_t i = 0; i < 3; ++i) EXPECT_TRUE(read[i] == Filled(i, 1)) << i;
  }
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 5);  // 2 here, 3 there
  DisposeClusters(clusters);
}

TEST_F(SignalXY, OnlyALimitWithSecondsOnAnXYSessionRegistersTheAbort) {
  const uint32_t single = Filling(kvMode_SignalInSinglePoint);
  SvHandle other = nullptr;
  const SvTime fractionOnly{1ull << 63, 0}, withSeconds{0, 5};
  const struct {
    uint32_t session;
    const SvTime *limit;
    int32_t registrations;
  } cases[] = {{session_, nullptr, 0},
               {session_, &fractionOnly, 0},
               {single, &withSeconds, 0},
               {session_, &withSeconds, 1}};
  for (const auto &c : cases) {
    svsimReset();
    ASSERT_EQ(kvsvReadSignalXY(c.session, 2, c.limit, c.session == single ? &other : &clusters_),
              0);
    EXPECT_EQ(svsimCleanupRegistrations(), c.registrations);
  }
  uint64_t argument = 0;
  int32_t mode = 0;
  ASSERT_EQ(svsimLastCleanup(nullptr, &argument, &mode), 1);
  EXPECT_EQ(argument, session_);
  EXPECT_EQ(mode, 6);
  DisposeClusters(other);
}

TEST_F(SignalXY, FailuresBeforeTheDriverEmptyTheArrays) {
  // An unknown signal count disposes of nothing: it does not say how many clusters there are.
  const struct {
    const char *what;
    void (*arm)();
    kvsvStatus status;
    bool disposed;
  } cases[] = {
      {"count", FailSignalCount, kDriverFault, false},
      {"mode", [] { kvsimFailProperty("kvGetProperty", kvPropSession_Mode, kDriverFault, 1); },
       kDriverFault, true},
      {"outer array", [] { svsimFailResizeAt(1); }, kvErrOutputMemory, true},
      {"value array", FailFirstAllocation, kvErrOutputMemory, true},
      {"timestamp array", [] { svsimFailAllocAt(2); }, kvErrOutputMemory, true},
  };
  int32_t samples = 2;
  for (const auto &c : cases) {
    ASSERT_EQ(Read(samples), 0) << c.what;
    const int32_t driverReads = kvsimCountCalls("kvReadSignalXY");
    c.arm();
    samples += 2;  // a longer run sizes everything again: the count, the outer array, each element
    EXPECT_EQ(Read(samples), c.status) << c.what;
    EXPECT_EQ(kvsimCountCalls("kvReadSignalXY"), driverReads) << c.what;
    EXPECT_EQ(Count(clusters_), 0) << c.what;
    EXPECT_EQ(*Element(clusters_, 1, true) == nullptr, c.disposed) << c.what;
    EXPECT_EQ(*Element(clusters_, 2, false) == nullptr, c.disposed) << c.what;
    EXPECT_EQ(Slot(session_)->cachedSamples, kUnknown) << c.what;
  }
  ASSERT_EQ(Read(samples), 0);
  ExpectFilled(static_cast<uint32_t>(samples));
  const uint32_t fresh = Filling(kvMode_SignalInXY);
  SvHandle none = nullptr;
  svsimFailAllocAt(1);
  EXPECT_EQ(kvsvReadSignalXY(fresh, 2, nullptr, &none), kvErrOutputMemory);
  EXPECT_EQ(none, nullptr);
}

TEST_F(SignalXY, AFailedDriverReadKeepsWhatTheRegionsHold) {
  ASSERT_EQ(Read(3), 0);
  ASSERT_EQ(kvsimFailCall("kvReadSignalXY", kDriverFault, 1), 0);
  EXPECT_EQ(Read(3), kDriverFault);
  ExpectFilled(3);  // as the last read left the regions
  EXPECT_EQ(Slot(session_)->cachedSamples, kUnknown);
  ASSERT_EQ(Read(3), 0);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 2);  // sized again
}

TEST_F(SignalXY, ElementsAreMadeAgainNotResized) {
  ASSERT_EQ(Read(2), 0);
  svDisposeHandle(*Element(clusters_, 1, true));  // by the program, between two reads
  *Element(clusters_, 1, true) = nullptr;
  const struct {
    int32_t samples;
    uint64_t made, freed, resized;
  } steps[] = {{2, 1, 0, 0}, {6, 6, 6, 1}, {1, 0, 0, 1}};  // the resizes are the outer array's
  for (const auto &step : steps) {
    svsimResetCounters();
    ASSERT_EQ(Read(step.samples), 0);
    EXPECT_EQ(svsimAllocCount(), step.made) << step.samples;
    EXPECT_EQ(svsimFreeCount(), step.freed) << step.samples;
    EXPECT_EQ(svsimResizeCount(), step.resized) << step.samples;
  }
  EXPECT_EQ(svGetHandleSize(*Element(clusters_, 0, true)), 6u * 8 + 8);  // never shrunk
  ExpectFilled(1);
}

TEST_F(SignalXY, GuardNullAndSkip) {
  const uint8_t skip = 1, go = 0;
  EXPECT_EQ(kvsvReadSignalXYEx(0x20000999u, 2, nullptr, &clusters_, &skip), 0);
  EXPECT_EQ(kvsvReadSignalXYEx(0x20000999u, 2, nullptr, &clusters_, &go), kvErrInvalidSession);
  EXPECT_EQ(kvsvReadSignalXY(session_, 2, nullptr, nullptr), kvErrNullArgument);
  Slot(session_)->guard = 1;
  EXPECT_EQ(Read(2), kvErrSessionBusy);
  EXPECT_EQ(clusters_, nullptr);
  Slot(session_)->guard = 0;
  EXPECT_EQ(kvsvReadSignalXYEx(session_, 2, nullptr, &clusters_, &go), 0);
  EXPECT_EQ(Count(clusters_), 3);
}

class SignalXYWrite : public SlotFixture {
 protected:
  void TearDown() override {
    DisposeClusters(clusters_);
    SlotFixture::TearDown();
  }
  kvsvStatus Write(uint32_t writer, const std::vector<tXY> &signals, double timeout = 0.0) {
    DisposeClusters(clusters_);
    clusters_ = MakeClusters(signals);
    return kvsvWriteSignalXY(writer, clusters_, timeout);
  }
  // The last value that the write put on the network for each signal (0.0 for none).
  static std::vector<double> LastValues(const std::string &list) {
    uint32_t reader = 0;
    EXPECT_EQ(kvCreateSession(":memory:", "", list.c_str(), "CAN2", 0, &reader), 0);
    std::vector<double> values(3);
    kvsimGetSignalValues(reader, values.data(), 3);
    return values;
  }

  SvHandle clusters_ = nullptr;
};

TEST_F(SignalXYWrite, PairsGoDownAsFlatRuns) {
  const struct {
    std::vector<tXY> signals;
    std::vector<double> last;
    uint32_t valuesSize;
  } cases[] = {
      {{{{1, 2}, {10, 11}}, {{3}, {20}}, {{}, {}}}, {11, 20, 0}, 3 * 2 * 8},
      // More values than times: the times decide.
      {{{{1}, {10, 11, 12}}, {{1, 2}, {20, 21}}, {{}, {30}}}, {10, 21, 0}, 3 * 3 * 8},
      // No times at all: every value goes.
      {{{{}, {10, 11}}, {{}, {}}, {{}, {30, 31, 32}}}, {11, 0, 32}, 3 * 3 * 8},
  };
  char round = 'a';  // signals of their own for each case, so that values before do not show
  for (const auto &c : cases) {
    const std::string list = std::string("A") + round + ",B" + round + ",C" + round;
    ++round;
    ASSERT_EQ(Write(MakeSession(list, kvMode_SignalOutXY), c.signals), 0) << list;
    EXPECT_EQ(LastValues(list), c.last) << list;
    EXPECT_EQ(LastCall("kvWriteSignalXY").size1, c.valuesSize) << list;
    EXPECT_EQ(LastCall("kvWriteSignalXY").size2, 12u) << list;
  }
}

TEST_F(SignalXYWrite, TheAreaIsReplacedOnlyForLongerRuns) {
  const uint32_t writer = MakeSession("A,B,C", kvMode_SignalOutXY);
  const struct {
    int32_t longest;
    bool replaced;
    double timeout;
  } writes[] = {{3, true, 0.0}, {1, false, 2.5}, {4, true, 0.0}};
  for (const auto &w : writes) {
    svsimReset();
    ASSERT_EQ(
        Write(writer, {{{}, std::vector<double>(w.longest, 1.0)}, {{}, {2}}, {{}, {}}}, w.timeout),
        0);
    const int32_t run = w.replaced ? w.longest : 3;
    EXPECT_EQ(Slot(writer)->cachedSamples, run);
    EXPECT_EQ(Slot(writer)->frameBufferSize, (run * 16u + 4) * 3);
    EXPECT_EQ(LastCall("kvWriteSignalXY").size1, 3u * 8 * w.longest);  // the stride is the write's
    EXPECT_EQ(svsimCleanupRegistrations(), w.timeout == 0.0 ? 0 : 1);
  }
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 1);
}

TEST_F(SignalXYWrite, FailuresForgetTheSignalCount) {
  const uint32_t writer = MakeSession("A,B,C", kvMode_SignalOutXY);
  const std::vector<tXY> three = {{{}, {1}}, {{}, {2}}, {{}, {3}}};
  const struct {
    std::vector<tXY> signals;
    void (*arm)();
    kvsvStatus status;
  } cases[] = {
      {{{{}, {1}}, {{}, {2}}}, NoFailure, kvErrElementCountMismatch},
      {three, FailSignalCount, kDriverFault},
      {three, [] { kvsimFailCall("kvWriteSignalXY", kDriverFault, 1); }, kDriverFault},
  };
  for (const auto &c : cases) {
    c.arm();
    EXPECT_EQ(Write(writer, c.signals), c.status);
    EXPECT_EQ(Slot(writer)->cachedCount, kUnknown);
  }
  EXPECT_EQ(kvsvWriteSignalXY(writer, nullptr, 0.0), kvErrElementCountMismatch);
  ASSERT_EQ(Write(writer, three), 0);
  EXPECT_EQ(Slot(writer)->cachedCount, 3);
  EXPECT_EQ(LastValues("A,B,C"), (std::vector<double>{1, 2, 3}));
}

}  // namespace
