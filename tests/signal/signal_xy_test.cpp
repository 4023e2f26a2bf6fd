// XY reads and writes: the marshalling between the driver's flat regions and the host's clusters,
// the cache that keeps a steady loop free of property reads and allocations, and what every
// failure leaves behind.
#include "signal/signal_test_support.h"
#include "support/tesla_signals.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

constexpr uint64_t kNow = 20000000;  // 2 s, raw

// What a filled read hands out for each of three signals: value 1000 i + k of signal i, stamped
// with the clock plus k.
std::vector<tXY> Filled(uint32_t pairs) {
  std::vector<tXY> expected(3);
  for (uint32_t n = 0; n < 3 * pairs; ++n) {
    expected[n % 3].times.push_back(kNow + n / 3);
    expected[n % 3].values.push_back(1000.0 * (n % 3) + n / 3);
  }
  return expected;
}

TEST_F(SignalTest, XYReadsFillOneClusterPerSignalAndSteadyOnesCostNothing) {
  const uint32_t session = Filling("A,B,C", kvMode_SignalInXY);
  kvsimSetClock(kNow);
  ASSERT_EQ(kvsimSetSignalReadFill(session, 3), 0);  // the driver gives 3 of a run of 4
  ASSERT_EQ(kvsvReadSignalXY(session, 4, nullptr, &clusters_), 0);
  EXPECT_EQ(ReadClusters(clusters_), Filled(3));
  EXPECT_EQ(Sizes(), std::make_pair(3u * 4 * 8, 3u * 4));  // the timestamps' region is as large
  // An element that the program disposed of is made again; a longer run makes every element
  // again, and a shorter one none (the resizes are the outer array's); a steady read goes to the
  // driver and nothing else.
  svDisposeHandle(*Element(clusters_, 1, true));
  *Element(clusters_, 1, true) = nullptr;
  const struct {
    int32_t samples;
    std::tuple<uint64_t, uint64_t, uint64_t> counts;  // made, resized, freed
    int32_t driverCalls;
  } steps[] = {{4, {1, 0, 0}, 1}, {6, {6, 1, 6}, 3}, {1, {0, 1, 0}, 3}, {1, {0, 0, 0}, 1}};
  for (const auto &step : steps) {
    svsimResetCounters();
    kvsimLogClear();
    ASSERT_EQ(kvsvReadSignalXY(session, step.samples, nullptr, &clusters_), 0);
    EXPECT_EQ(HostCounts(), step.counts) << step.samples;
    EXPECT_EQ(kvsimLogCount(), step.driverCalls) << step.samples;
  }
  EXPECT_EQ(svGetHandleSize(*Element(clusters_, 0, true)), 6u * 8 + 8);  // never shrunk
  EXPECT_EQ(ReadClusters(clusters_), Filled(1));
  // A count of 0 is passed on: two empty regions, and the pair counts. A negative count stands
  // for the queue size.
  uint32_t queue = 6;
  ASSERT_EQ(kvSetProperty(session, kvPropSession_QueueSize, 4, &queue), 0);
  ASSERT_EQ(kvsvReadSignalXY(session, 0, nullptr, &clusters_), 0);
  EXPECT_EQ(Sizes(), std::make_pair(0u, 12u));
  ASSERT_EQ(kvsvReadSignalXY(session, -1, nullptr, &clusters_), 0);
  EXPECT_EQ(Sizes().first, 3u * 6 * 8);
  // Any other mode reads one value per signal with its time; 0 sizes again on every call.
  const uint32_t single = Filling("A,B,C", kvMode_SignalInSinglePoint);
  SvHandle other = nullptr;
  kvsimLogClear();
  for (int32_t samples : {0, 0, 7}) {
    ASSERT_EQ(kvsvReadSignalXY(single, samples, nullptr, &other), 0);
    EXPECT_EQ(Sizes(), std::make_pair(24u, 24u));
    EXPECT_EQ(ReadClusters(other), Filled(1));
  }
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 3);
  DisposeClusters(other);
}

TEST_F(SignalTest, XYReadFailuresEmptyTheArrays) {
  const uint32_t session = Filling("A,B,C", kvMode_SignalInXY);
  kvsimSetClock(kNow);
  // Each failure of a read that sizes everything again (a longer run: the count, the outer array,
  // each element) empties the array. An unknown signal count disposes of nothing: it does not say
  // how many clusters there are.
  const struct {
    const char *what;
    void (*arm)();
    kvsvStatus status;
    bool disposed;
  } cases[] = {
      {"count", FailSignalCount, kDriverFault, false},
      {"outer array", FailFirstResize, kvErrOutputMemory, true},
      {"timestamp array", [] { svsimFailAllocAt(2); }, kvErrOutputMemory, true},
  };
  int32_t samples = 2;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    ASSERT_EQ(kvsvReadSignalXY(session, samples, nullptr, &clusters_), 0);
    kvsimLogClear();
    c.arm();
    EXPECT_EQ(kvsvReadSignalXY(session, samples += 2, nullptr, &clusters_), c.status);
    EXPECT_EQ(kvsimCountCalls("kvReadSignalXY"), 0);
    EXPECT_EQ(Count(clusters_), 0);
    EXPECT_EQ(*Element(clusters_, 1, true) == nullptr, c.disposed);
    EXPECT_EQ(*Element(clusters_, 2, false) == nullptr, c.disposed);
    EXPECT_EQ(Slot(session)->cachedSamples, kUnknown);
  }
  // A skipped call does nothing.
  const uint8_t skip = 1, go = 0;
  EXPECT_EQ(kvsvReadSignalXYEx(session, 1, nullptr, nullptr, &skip), 0);
  EXPECT_EQ(kvsvReadSignalXYEx(session, 1, nullptr, nullptr, &go), kvErrNullArgument);
}

// Writes in turn through one session: each puts the last value of each signal on the network
// (or leaves the one before), and replaces the driver's area only for a longer run.
TEST_F(SignalTest, XYWritesSendPairsAsFlatRunsAndFailuresForgetTheCount) {
  const uint32_t writer = MakeSession("A,B,C", kvMode_SignalOutXY);
  const auto failDriver = [] { kvsimFailCall("kvWriteSignalXY", kDriverFault, 1); };
  const std::vector<tXY> three = {{{}, {1}}, {{}, {2}}, {{}, {3}}};
  const struct {
    std::vector<tXY> signals;
    std::vector<double> last;
    uint32_t longest;  // pairs of the longest signal
    int32_t run;       // of the area afterwards
    double timeout = 0.0;
    void (*arm)() = NoFailure;
    kvsvStatus status = 0;
  } cases[] = {
      {{{{1, 2}, {10, 11}}, {{3}, {20}}, {{}, {}}}, {11, 20, 0}, 2, 2},
      // More values than times: the times decide.
      {{{{1}, {10, 11, 12}}, {{1, 2}, {20, 21}}, {{}, {30}}}, {10, 21, 0}, 3, 3},
      // No times at all: every value goes.
      {{{{}, {10, 11}}, {{}, {}}, {{}, {30, 31, 32}}}, {11, 21, 32}, 3, 3},
      {three, {1, 2, 3}, 1, 3, 2.5},
      {{{{}, {4, 5, 6, 7}}, {{}, {8}}, {{}, {}}}, {7, 8, 3}, 4, 4},
      {{{{}, {1}}, {{}, {2}}}, {}, 1, 4, 0.0, NoFailure, kvErrElementCountMismatch},
      {three, {}, 1, 4, 0.0, FailSignalCount, kDriverFault},
      {three, {}, 1, 4, 0.0, failDriver, kDriverFault},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << "run " << c.run << ", status " << c.status);
    svsimReset();
    kvsimLogClear();
    DisposeClusters(clusters_);
    clusters_ = MakeClusters(c.signals);
    c.arm();
    EXPECT_EQ(kvsvWriteSignalXY(writer, clusters_, c.timeout), c.status);
    EXPECT_EQ(Slot(writer)->frameBufferSize, (c.run * 16u + 4) * 3);
    EXPECT_EQ(Slot(writer)->cachedCount, c.status == 0 ? 3 : kUnknown);
    if (c.status != 0) continue;
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), &c == cases ? 1 : 0);
    EXPECT_EQ(Sizes(), std::make_pair(3 * 8 * c.longest, 12u));  // the stride is the write's
    EXPECT_EQ(svsimCleanupRegistrations(), c.timeout == 0.0 ? 0 : 1);
    std::vector<double> last(3);
    kvsimGetSignalValues(writer, last.data(), 3);
    EXPECT_EQ(last, c.last);
  }
  EXPECT_EQ(kvsvWriteSignalXY(writer, nullptr, 0.0), kvErrElementCountMismatch);
  // The times go down with the values: a reader of a database's signal on the other interface
  // gets the pairs as they were written.
  const tSignalCase &signal = TeslaSignals()[3];
  const uint32_t tesla = TeslaSession("CAN1", kvMode_SignalOutXY, signal.name);
  const uint32_t reader = TeslaSession("CAN2", kvMode_SignalInXY, signal.name);
  ASSERT_EQ(PlaceSlot(tesla) + PlaceSlot(reader), 0);
  DisposeClusters(clusters_);
  clusters_ = MakeClusters({{{kNow, kNow + 7}, {signal.value, signal.value}}});
  ASSERT_EQ(kvsvWriteSignalXY(tesla, clusters_, 0.0), 0);
  SvHandle read = nullptr;
  ASSERT_EQ(kvsvReadSignalXY(reader, 4, nullptr, &read), 0);
  EXPECT_EQ(ReadClusters(read)[0].times, (std::vector<uint64_t>{kNow, kNow + 7}));
  DisposeClusters(read);
}

}  // namespace
