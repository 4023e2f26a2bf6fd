// XY reads and writes through the guarded path: the marshalling between the driver's flat regions
// and the host's clusters, the cache that keeps a steady loop free of property reads and
// allocations, and what every failure leaves behind.
#include <gtest/gtest.h>

#include <climits>
#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "signal/xy_arrays.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

constexpr int32_t kDriverFault = -1074388990;  // a driver error status
constexpr uint64_t kNow = 20000000;            // 2 s, raw

kvsimCallRecord LastCall(const char *function) {
  kvsimCallRecord record{};
  for (int32_t i = kvsimLogCount() - 1; i >= 0; --i) {
    if (kvsimLogEntry(i, &record) == 1 && std::string(record.function) == function) return record;
  }
  ADD_FAILURE() << "no call of " << function;
  return record;
}

// What a filled read hands out for signal i: run k at value 1000 i + k, stamped the clock plus k.
tXY Filled(uint32_t signal, uint32_t pairs) {
  tXY expected;
  for (uint32_t k = 0; k < pairs; ++k) {
    expected.times.push_back(kNow + k);
    expected.values.push_back(1000.0 * signal + k);
  }
  return expected;
}

bool operator==(const tXY &a, const tXY &b) { return a.times == b.times && a.values == b.values; }

class SignalXYRead : public SlotFixture {
 protected:
  void SetUp() override {
    SlotFixture::SetUp();
    session_ = MakeSession("A,B,C", kvMode_SignalInXY);
    ASSERT_EQ(kvsimSetSignalReadFill(session_, INT32_MAX), 0);
    kvsimSetClock(kNow);
  }
  void TearDown() override {
    DisposeClusters(clusters_);
    SlotFixture::TearDown();
  }
  kvsvStatus Read(int32_t samples, const SvTime *limit = nullptr) {
    return kvsvReadSignalXY(session_, samples, limit, &clusters_);
  }
  // The state every failure before the driver call leaves: no clusters, a cache that no sample
  // count matches, and, if the signal count is known, no element handles.
  void ExpectEmptied(const char *what, bool disposed) {
    ASSERT_NE(clusters_, nullptr) << what;
    EXPECT_EQ(Count(clusters_), 0) << what;
    for (size_t i = 0; i < 3; ++i) {
      EXPECT_EQ(*Element(clusters_, i, false) == nullptr, disposed) << what;
      EXPECT_EQ(*Element(clusters_, i, true) == nullptr, disposed) << what;
    }
    EXPECT_EQ(Slot(session_)->cachedSamples, kUnknown) << what;
  }

  uint32_t session_ = 0;
  SvHandle clusters_ = nullptr;
};

TEST_F(SignalXYRead, FillsOneClusterPerSignalFromTheRegions) {
  ASSERT_EQ(kvsimSetSignalReadFill(session_, 3), 0);  // the driver gives 3 of a run of 4
  ASSERT_EQ(Read(4), 0);
  const std::vector<tXY> read = ReadClusters(clusters_);
  ASSERT_EQ(read.size(), 3u);
  for (uint32_t i = 0; i < 3; ++i) EXPECT_TRUE(read[i] == Filled(i, 3)) << i;
  EXPECT_EQ(svGetHandleSize(clusters_), 3u * 16 + 8);
  EXPECT_EQ(svGetHandleSize(*Element(clusters_, 2, true)), 4u * 8 + 8);
  EXPECT_EQ(svGetHandleSize(*Element(clusters_, 2, false)), 4u * 16 + 8);
  const kvsimCallRecord call = LastCall("kvReadSignalXY");
  EXPECT_EQ(call.size1, 3u * 4 * 8);  // the value region; the timestamp region is as large
  EXPECT_EQ(call.size2, 3u * 4);
  EXPECT_EQ(Slot(session_)->frameBufferSize, (4u * 16 + 4) * 3);
}

TEST_F(SignalXYRead, SteadyReadsAllocateNothingAndReadNoProperty) {
  ASSERT_EQ(Read(5), 0);
  svsimResetCounters();
  kvsimLogClear();
  for (int i = 0; i < 3; ++i) ASSERT_EQ(Read(5), 0);
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
  EXPECT_EQ(kvsimLogCount(), 3);  // the driver read and nothing else
  EXPECT_TRUE(ReadClusters(clusters_)[1] == Filled(1, 5));
}

TEST_F(SignalXYRead, SampleCountsOfZeroAndBelow) {
  const uint32_t single = MakeSession("A,B,C", kvMode_SignalInSinglePoint);
  ASSERT_EQ(kvsimSetSignalReadFill(single, INT32_MAX), 0);
  uint32_t queue = 6;
  ASSERT_EQ(kvSetProperty(session_, kvPropSession_QueueSize, 4, &queue), 0);
  // An XY session passes 0 on: two empty regions and the pair counts.
  ASSERT_EQ(Read(0), 0);
  EXPECT_EQ(LastCall("kvReadSignalXY").size1, 0u);
  EXPECT_EQ(LastCall("kvReadSignalXY").size2, 12u);
  // A negative count stands for the queue size, read once for the life of the slot.
  ASSERT_EQ(Read(-1), 0);
  EXPECT_EQ(LastCall("kvReadSignalXY").size1, 3u * 6 * 8);
  queue = 9;
  ASSERT_EQ(kvSetProperty(session_, kvPropSession_QueueSize, 4, &queue), 0);
  ASSERT_EQ(Read(-1), 0);
  EXPECT_EQ(LastCall("kvReadSignalXY").size1, 3u * 6 * 8);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_QueueSize), 1);
  // A single-point session reads one value per signal with its time, whatever is asked for; 0
  // rebuilds on every call, as its cache then holds 1.
  SvHandle clusters = nullptr;
  for (int call = 0; call < 2; ++call) {
    ASSERT_EQ(kvsvReadSignalXY(single, 0, nullptr, &clusters), 0);
    const kvsimCallRecord record = LastCall("kvReadSignalSinglePoint");
    EXPECT_EQ(record.size1, 24u);
    EXPECT_EQ(record.size2, 24u);
    EXPECT_TRUE(ReadClusters(clusters)[2] == Filled(2, 1));
  }
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 4);  // 2 for each session
  // The values lie side by side, whatever run the area was laid out for.
  ASSERT_EQ(kvsvReadSignalXY(single, 7, nullptr, &clusters), 0);
  const std::vector<tXY> read = ReadClusters(clusters);
  for (uint32_t i = 0; i < 3; ++i) EXPECT_TRUE(read[i] == Filled(i, 1)) << i;
  DisposeClusters(clusters);
}

TEST_F(SignalXYRead, OnlyATimeLimitWithSecondsOnAnXYSessionRegistersTheAbort) {
  const uint32_t single = MakeSession("A", kvMode_SignalInSinglePoint);
  SvHandle other = nullptr;
  const SvTime fractionOnly{1ull << 63, 0};
  const SvTime withSeconds{0, 5};
  struct Case {
    uint32_t session;
    const SvTime *limit;
    int32_t registrations;
  } cases[] = {{session_, nullptr, 0},
               {session_, &fractionOnly, 0},
               {single, &withSeconds, 0},
               {session_, &withSeconds, 1}};
  for (const Case &c : cases) {
    svsimReset();
    SvHandle *clusters = c.session == session_ ? &clusters_ : &other;
    ASSERT_EQ(kvsvReadSignalXY(c.session, 2, c.limit, clusters), 0);
    EXPECT_EQ(svsimCleanupRegistrations(), c.registrations);
  }
  uint64_t argument = 0;
  int32_t mode = 0;
  ASSERT_EQ(svsimLastCleanup(nullptr, &argument, &mode), 1);
  EXPECT_EQ(argument, session_);
  EXPECT_EQ(mode, 6);
  DisposeClusters(other);
}

TEST_F(SignalXYRead, FailuresBeforeTheDriverEmptyTheArrays) {
  // An unknown signal count disposes of nothing: it does not say how many clusters there are.
  struct Case {
    const char *what;
    void (*arm)();
    kvsvStatus status;
    bool disposed;
  } cases[] = {
      {"signal count",
       [] { kvsimFailProperty("kvGetProperty", kvPropSession_NumInList, kDriverFault, 1); },
       kDriverFault, false},
      {"session mode",
       [] { kvsimFailProperty("kvGetProperty", kvPropSession_Mode, kDriverFault, 1); },
       kDriverFault, true},
      {"outer array", [] { svsimFailResizeAt(1); }, kvErrOutputMemory, true},
      {"value array", [] { svsimFailAllocAt(1); }, kvErrOutputMemory, true},
      {"timestamp array", [] { svsimFailAllocAt(2); }, kvErrOutputMemory, true},
  };
  int32_t samples = 2;
  for (const Case &c : cases) {
    ASSERT_EQ(Read(samples), 0) << c.what;
    const int32_t driverReads = kvsimCountCalls("kvReadSignalXY");
    c.arm();
    // A longer run rebuilds everything: the count, the outer array and every element.
    samples += 2;
    EXPECT_EQ(Read(samples), c.status) << c.what;
    EXPECT_EQ(kvsimCountCalls("kvReadSignalXY"), driverReads) << c.what;
    ExpectEmptied(c.what, c.disposed);
  }
  // The next read builds again from nothing.
  ASSERT_EQ(Read(samples), 0);
  EXPECT_TRUE(ReadClusters(clusters_)[2] == Filled(2, static_cast<uint32_t>(samples)));
}

TEST_F(SignalXYRead, AFirstReadThatTheHostRefusesLeavesNoArray) {
  svsimFailAllocAt(1);
  EXPECT_EQ(Read(2), kvErrOutputMemory);
  EXPECT_EQ(clusters_, nullptr);
  EXPECT_EQ(Slot(session_)->cachedSamples, kUnknown);
}

TEST_F(SignalXYRead, AFailedDriverReadKeepsWhatTheRegionsHold) {
  ASSERT_EQ(Read(3), 0);
  ASSERT_EQ(kvsimFailCall("kvReadSignalXY", kDriverFault, 1), 0);
  EXPECT_EQ(Read(3), kDriverFault);
  EXPECT_TRUE(ReadClusters(clusters_)[1] == Filled(1, 3));  // the regions as the last read left them
  EXPECT_EQ(Slot(session_)->cachedSamples, kUnknown);
  const int32_t countReads = kvsimCountPropertyReads(kvPropSession_NumInList);
  ASSERT_EQ(Read(3), 0);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), countReads + 1);  // rebuilt
}

TEST_F(SignalXYRead, ElementsAreMadeAgainNotResized) {
  ASSERT_EQ(Read(2), 0);
  // The program disposed of one element, and the next read asks for longer runs.
  svDisposeHandle(*Element(clusters_, 1, true));
  *Element(clusters_, 1, true) = nullptr;
  svsimResetCounters();
  ASSERT_EQ(Read(2), 0);
  EXPECT_EQ(svsimAllocCount(), 1u);
  EXPECT_TRUE(ReadClusters(clusters_)[1] == Filled(1, 2));
  svsimResetCounters();
  ASSERT_EQ(Read(6), 0);
  EXPECT_EQ(svsimAllocCount(), 6u);
  EXPECT_EQ(svsimFreeCount(), 6u);
  EXPECT_EQ(svsimResizeCount(), 1u);  // the outer array only
  // A shorter run keeps the larger elements as they are.
  svsimResetCounters();
  ASSERT_EQ(Read(1), 0);
  EXPECT_EQ(svsimAllocCount() + svsimFreeCount(), 0u);
  EXPECT_EQ(svGetHandleSize(*Element(clusters_, 0, true)), 6u * 8 + 8);
}

TEST_F(SignalXYRead, GuardNullAndSkip) {
  const uint8_t skip = 1, go = 0;
  EXPECT_EQ(kvsvReadSignalXYEx(0x20000999u, 2, nullptr, &clusters_, &skip), 0);
  EXPECT_EQ(clusters_, nullptr);
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
  void SetUp() override {
    SlotFixture::SetUp();
    writer_ = MakeSession("A,B,C", kvMode_SignalOutXY);
    kvsimSetClock(kNow);
  }
  void TearDown() override {
    DisposeClusters(clusters_);
    SlotFixture::TearDown();
  }
  kvsvStatus Write(const std::vector<tXY> &signals, double timeout = 0.0) {
    DisposeClusters(clusters_);
    clusters_ = MakeClusters(signals);
    return kvsvWriteSignalXY(writer_, clusters_, timeout);
  }
  // The last value of each signal that the write put on the network (0.0 for none).
  static std::vector<double> LastValues(const std::string &list) {
    uint32_t reader = 0;
    EXPECT_EQ(kvCreateSession(":memory:", "", list.c_str(), "CAN2", kvMode_SignalInSinglePoint,
                              &reader),
              0);
    std::vector<double> values(3);
    kvsimGetSignalValues(reader, values.data(), 3);
    return values;
  }

  uint32_t writer_ = 0;
  SvHandle clusters_ = nullptr;
};

TEST_F(SignalXYWrite, PairsGoDownAsFlatRuns) {
  struct Case {
    const char *what;
    std::vector<tXY> signals;
    std::vector<double> last;  // what each signal's last pair put on the network
    uint32_t valuesSize;
  } cases[] = {
      {"pairs of three lengths", {{{1, 2}, {10, 11}}, {{3}, {20}}, {{}, {}}}, {11, 20, 0}, 3 * 2 * 8},
      {"more values than times: the times decide",
       {{{1}, {10, 11, 12}}, {{1, 2}, {20, 21}}, {{}, {30}}}, {10, 21, 0}, 3 * 3 * 8},
      {"no times at all: every value goes", {{{}, {10, 11}}, {{}, {}}, {{}, {30, 31, 32}}},
       {11, 0, 32}, 3 * 3 * 8},
  };
  // Each case names signals of its own, so that values of the cases before do not show.
  char round = 'a';
  for (const Case &c : cases) {
    const std::string list = std::string("A") + round + ",B" + round + ",C" + round;
    ++round;
    writer_ = MakeSession(list, kvMode_SignalOutXY);
    ASSERT_EQ(Write(c.signals), 0) << c.what;
    EXPECT_EQ(LastValues(list), c.last) << c.what;
    EXPECT_EQ(LastCall("kvWriteSignalXY").size1, c.valuesSize) << c.what;
    EXPECT_EQ(LastCall("kvWriteSignalXY").size2, 12u) << c.what;
  }
}

TEST_F(SignalXYWrite, TheAreaIsReplacedOnlyForLongerRuns) {
  ASSERT_EQ(Write({{{}, {1, 2, 3}}, {{}, {}}, {{}, {}}}), 0);
  EXPECT_EQ(Slot(writer_)->cachedSamples, 3);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, (3u * 16 + 4) * 3);
  void *area = Slot(writer_)->frameBuffer;
  ASSERT_EQ(Write({{{}, {1}}, {{}, {2}}, {{}, {}}}), 0);
  EXPECT_EQ(Slot(writer_)->frameBuffer, area);
  EXPECT_EQ(LastCall("kvWriteSignalXY").size1, 3u * 1 * 8);  // the stride is this write's
  ASSERT_EQ(Write({{{}, {1, 2, 3, 4}}, {{}, {}}, {{}, {}}}), 0);
  EXPECT_EQ(Slot(writer_)->cachedSamples, 4);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, (4u * 16 + 4) * 3);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 1);
}

TEST_F(SignalXYWrite, FailuresForgetTheSignalCount) {
  struct Case {
    const char *what;
    std::vector<tXY> signals;
    void (*arm)();
    kvsvStatus status;
  } cases[] = {
      {"two clusters for three signals", {{{}, {1}}, {{}, {2}}}, [] {}, kvErrElementCountMismatch},
      {"signal count unreadable", {{{}, {1}}, {{}, {2}}, {{}, {3}}},
       [] { kvsimFailProperty("kvGetProperty", kvPropSession_NumInList, kDriverFault, 1); },
       kDriverFault},
      {"driver refuses", {{{}, {1}}, {{}, {2}}, {{}, {3}}},
       [] { kvsimFailCall("kvWriteSignalXY", kDriverFault, 1); }, kDriverFault},
  };
  for (const Case &c : cases) {
    c.arm();
    EXPECT_EQ(Write(c.signals), c.status) << c.what;
    EXPECT_EQ(Slot(writer_)->cachedCount, kUnknown) << c.what;
  }
  EXPECT_EQ(kvsvWriteSignalXY(writer_, nullptr, 0.0), kvErrElementCountMismatch);
  ASSERT_EQ(Write({{{}, {1}}, {{}, {2}}, {{}, {3}}}), 0);
  EXPECT_EQ(Slot(writer_)->cachedCount, 3);
  EXPECT_EQ(LastValues("A,B,C"), (std::vector<double>{1, 2, 3}));
}

TEST_F(SignalXYWrite, ATimeLimitRegistersTheAbort) {
  for (double timeout : {0.0, 2.5}) {
    svsimReset();
    ASSERT_EQ(Write({{{}, {1}}, {{}, {2}}, {{}, {3}}}, timeout), 0);
    EXPECT_EQ(svsimCleanupRegistrations(), timeout == 0.0 ? 0 : 1);
  }
}

}  // namespace
