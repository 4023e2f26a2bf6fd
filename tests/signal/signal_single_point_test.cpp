// Single-point signal reads and writes: the driver fills the host array in place, the array is
// sized again only when too small, and every failure leaves an empty array.
#include "signal/signal_test_support.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

TEST_F(SignalTest, SinglePointReadsFillTheArrayAndSizeItOnlyWhenTooSmall) {
  const uint32_t session = MakeSession("A,B,C", kvMode_SignalInSinglePoint);
  const struct {
    const char *what;
    int32_t size;  // what the program leaves the handle at; 0: as it is
    bool moves;    // every resize moves the block
    int32_t countReads;
    uint32_t sizeAfter;
  } cases[] = {
      {"no array yet", 0, false, 1, 32},
      {"left as it is", 0, false, 0, 32},
      {"shrunk by the program", 16, false, 1, 32},
      {"larger, used as it stands", 1024, false, 0, 1024},
      {"grown with every resize moving the block", 8, true, 1, 32},
  };
  double value = 0.5;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    if (c.size > 0) {
      ASSERT_EQ(svSetHandleSizeClr(values_, static_cast<size_t>(c.size)), 0);
    }
    svsimSetMoveOnResize(c.moves ? 1 : 0);
    const std::vector<double> published = {value *= -3, 1e9 + value, value / 7};
    ASSERT_EQ(kvsimSetSignalValues(session, published.data(), 3), 3);
    svsimResetCounters();
    kvsimLogClear();
    ASSERT_EQ(kvsvReadSignalSinglePoint(session, &values_), 0);
    EXPECT_EQ(ReadArray<double>(values_), published);
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), c.countReads);
    EXPECT_EQ(kvsimLogCount(), c.countReads + 1);  // and the driver's read, nothing else
    EXPECT_EQ(svsimAllocCount() + svsimResizeCount(), static_cast<uint64_t>(c.countReads));
    EXPECT_EQ(svGetHandleSize(values_), c.sizeAfter);
    EXPECT_EQ(Sizes(), std::make_pair(24u, 0u));  // no timestamps asked for
  }
}

TEST_F(SignalTest, SinglePointFailuresEmptyTheArray) {
  const auto failDriver = [] { kvsimFailCall("kvReadSignalSinglePoint", kDriverFault, 1); };
  const auto warnDriver = [] { kvsimFailCall("kvReadSignalSinglePoint", 0x3FF62077, 1); };
  const struct {
    const char *what;
    int32_t held;  // elements of the program's array
    void (*arm)();
    kvsvStatus status;
    int32_t count;  // of the same array afterwards
    bool countKnown, driverCalled;
  } cases[] = {
      {"count read fails", 5, FailSignalCount, kDriverFault, 0, false, false},
      {"host refuses to grow the array", 1, FailFirstResize, kvErrOutputMemory, 0, true, false},
      {"driver fails", 3, failDriver, kDriverFault, 0, true, true},
      {"driver warns", 3, warnDriver, 0x3FF62077, 3, true, true},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    const uint32_t session = MakeSession("A,B,C", kvMode_SignalInSinglePoint);
    SvHandle values = Keep(MakeArray(std::vector<double>(c.held, 9.0)));
    kvsimLogClear();
    c.arm();
    EXPECT_EQ(kvsvReadSignalSinglePoint(session, &values), c.status);
    EXPECT_EQ(Count(values), c.count);
    EXPECT_EQ(Slot(session)->cachedCount, c.countKnown ? 3 : kUnknown);
    EXPECT_EQ(kvsimCountCalls("kvReadSignalSinglePoint"), c.driverCalled ? 1 : 0);
  }
  EXPECT_EQ(kvsvReadSignalSinglePoint(0x00001FFFu, nullptr), kvErrNullArgument);
}

TEST_F(SignalTest, SinglePointWritesSendTheValuesOrNothing) {
  const uint32_t out = MakeSession("Torque,Gear", kvMode_SignalOutSinglePoint);
  values_ = MakeArray(std::vector<double>{312.75, 4});
  ASSERT_EQ(kvsvWriteSignalSinglePoint(out, values_), 0);
  EXPECT_EQ(Sizes().first, 16u);
  std::vector<double> seen(2);
  kvsimGetSignalValues(out, seen.data(), 2);
  EXPECT_EQ(seen, (std::vector<double>{312.75, 4}));
  // An empty or missing array goes down as size 0.
  for (SvHandle none : {Keep(MakeArray(std::vector<double>{})), static_cast<SvHandle>(nullptr)}) {
    kvsvWriteSignalSinglePoint(out, none);  // the driver refuses an empty buffer
    EXPECT_EQ(Sizes().first, 0u);
  }
}

}  // namespace
