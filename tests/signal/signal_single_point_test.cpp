// Single-point signal reads and writes through the guarded path, against both stand-ins.
#include <gtest/gtest.h>

#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

using nKVSVAPI100::kUnknown;

std::vector<double> Values(SvHandle array) {
  std::vector<double> out(64);
  const int32_t count = svsimReadDoubleArray(array, out.data(), static_cast<int32_t>(out.size()));
  out.resize(static_cast<size_t>(count));
  return out;
}

kvsimCallRecord LastCall() {
  kvsimCallRecord record{};
  EXPECT_EQ(kvsimLogEntry(kvsimLogCount() - 1, &record), 1);
  return record;
}

class SignalSinglePoint : public SlotFixture {
 protected:
  void SetUp() override {
    SlotFixture::SetUp();
    session_ = MakeSession("EngineSpeed,VehicleSpeed,CoolantTemp", kvMode_SignalInSinglePoint);
  }
  void TearDown() override {
    svDisposeHandle(values_);
    SlotFixture::TearDown();
  }
  void Publish(std::vector<double> v) {
    ASSERT_EQ(kvsimSetSignalValues(session_, v.data(), static_cast<int32_t>(v.size())),
              static_cast<int32_t>(v.size()));
  }

  uint32_t session_ = 0;
  SvHandle values_ = nullptr;
};

TEST_F(SignalSinglePoint, ReadsEveryValueInListOrderIntoANewArray) {
  Publish({2450.5, -17.25, 3.0e9});
  ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
  ASSERT_NE(values_, nullptr);
  EXPECT_EQ(Values(values_), (std::vector<double>{2450.5, -17.25, 3.0e9}));
  EXPECT_EQ(svGetHandleSize(values_), 3u * 8u + 8u);
  const kvsimCallRecord call = LastCall();
  EXPECT_STREQ(call.function, "kvReadSignalSinglePoint");
  EXPECT_EQ(call.size1, 24u);
  EXPECT_EQ(call.size2, 0u);  // no timestamps asked for
}

TEST_F(SignalSinglePoint, SteadyReadMakesNoAllocationAndReadsNoProperty) {
  Publish({1, 2, 3});
  ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
  Publish({4, 5, 6});
  svsimResetCounters();
  kvsimLogClear();
  for (int i = 0; i < 3; ++i) ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
  EXPECT_EQ(svsimAllocCount(), 0u);
  EXPECT_EQ(svsimResizeCount(), 0u);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 0);
  EXPECT_EQ(kvsimLogCount(), 3);  // the driver read and nothing else
  EXPECT_EQ(Values(values_), (std::vector<double>{4, 5, 6}));
}

TEST_F(SignalSinglePoint, TheProgramsHandleMakesTheCountBeReadAgainOnlyWhenTooSmall) {
  ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
  const struct {
    const char *what;
    int32_t size;  // what the program leaves the handle at; -1: handed back null
    bool moves;    // every resize moves the block
    int32_t countReads;
    uint32_t sizeAfter;
  } cases[] = {
      {"shrunk by the program", 16, false, 1, 32},
      {"handed back null", -1, false, 1, 32},
      {"larger, used as it stands", 1024, false, 0, 1024},
      {"grown with every resize moving the block", 8, true, 1, 32},
  };
  double value = 0;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    if (c.size < 0) {
      svDisposeHandle(values_);
      values_ = nullptr;
    } else {
      ASSERT_EQ(svSetHandleSizeClr(values_, static_cast<size_t>(c.size)), 0);
    }
    svsimSetMoveOnResize(c.moves ? 1 : 0);
    value += 10;
    Publish({value, value + 1, value + 2});
    svsimResetCounters();
    kvsimLogClear();
    ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), c.countReads);
    EXPECT_EQ(svsimAllocCount() + svsimResizeCount(), static_cast<uint64_t>(c.countReads));
    EXPECT_EQ(svGetHandleSize(values_), c.sizeAfter);
    EXPECT_EQ(Values(values_), (std::vector<double>{value, value + 1, value + 2}));
  }
}

TEST_F(SignalSinglePoint, DriverStatusesKeepTheCountAndAFailureEmptiesTheArray) {
  Publish({1, 2, 3});
  ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
  const struct {
    kvsvStatus status;
    std::vector<double> values;
  } cases[] = {{0x3FF62077, {5, 6, 7}}, {kvsimErrInternal, {}}};  // a warning still publishes
  for (const auto &c : cases) {
    SCOPED_TRACE(c.status);
    ASSERT_EQ(kvsimFailCall("kvReadSignalSinglePoint", c.status, 1), 0);
    Publish({5, 6, 7});
    EXPECT_EQ(kvsvReadSignalSinglePoint(session_, &values_), c.status);
    EXPECT_EQ(Values(values_), c.values);
    EXPECT_EQ(Slot(session_)->cachedCount, 3);
    kvsimLogClear();
    ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 0);
    EXPECT_EQ(Values(values_).size(), 3u);
  }
}

TEST_F(SignalSinglePoint, FailedCountReadForgetsTheCountAndEmptiesTheArray) {
  const double old[] = {9, 9, 9, 9, 9};
  values_ = svsimMakeDoubleArray(old, 5);
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_NumInList, kvsimErrInternal, 1), 0);
  EXPECT_EQ(kvsvReadSignalSinglePoint(session_, &values_), kvsimErrInternal);
  EXPECT_EQ(Values(values_).size(), 0u);
  EXPECT_EQ(Slot(session_)->cachedCount, kUnknown);
  EXPECT_EQ(kvsimCountCalls("kvReadSignalSinglePoint"), 0);
  kvsimLogClear();
  ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 1);
  EXPECT_EQ(Values(values_).size(), 3u);
}

TEST_F(SignalSinglePoint, HostRefusingToGrowTheArrayGivesOutputMemoryStatus) {
  // An existing handle that cannot grow: its count goes to 0 and it stays the same handle.
  const double old[] = {4};
  values_ = svsimMakeDoubleArray(old, 1);
  const SvHandle before = values_;
  svsimFailResizeAt(1);
  EXPECT_EQ(kvsvReadSignalSinglePoint(session_, &values_), kvErrOutputMemory);
  EXPECT_EQ(values_, before);
  EXPECT_EQ(Values(values_).size(), 0u);
  EXPECT_EQ(kvsimCountCalls("kvReadSignalSinglePoint"), 0);

  // No handle, and the host cannot make one.
  svDisposeHandle(values_);
  values_ = nullptr;
  svsimFailAllocAt(1);
  EXPECT_EQ(kvsvReadSignalSinglePoint(session_, &values_), kvErrOutputMemory);
  EXPECT_EQ(values_, nullptr);

  // The count stayed known, and the size test alone sends the next call back to the driver.
  EXPECT_EQ(Slot(session_)->cachedCount, 3);
  Publish({1, 2, 3});
  ASSERT_EQ(kvsvReadSignalSinglePoint(session_, &values_), 0);
  EXPECT_EQ(Values(values_), (std::vector<double>{1, 2, 3}));
}

TEST_F(SignalSinglePoint, SessionWithoutSignalsGivesAnEmptyArray) {
  const uint32_t empty = MakeSession("", kvMode_SignalInSinglePoint, "CAN3");
  SvHandle array = nullptr;
  const kvsvStatus status = kvsvReadSignalSinglePoint(empty, &array);
  Keep(array);
  EXPECT_GE(status, 0);
  ASSERT_NE(array, nullptr);
  EXPECT_EQ(svGetHandleSize(array), 8u);
  EXPECT_EQ(Values(array).size(), 0u);
  EXPECT_EQ(LastCall().size1, 0u);
}

TEST_F(SignalSinglePoint, EntryFailuresLeaveTheArrayAndTheDriverAlone) {
  const double kept[] = {1.25, 2.5};
  values_ = svsimMakeDoubleArray(kept, 2);
  nKVSVAPI100::tSessionSlot *slot = Slot(session_);
  struct Case {
    const char *what;
    uint32_t session;
    void (*before)(nKVSVAPI100::tSessionSlot *);
    kvsvStatus expected;
    uint32_t guardAfter;
    bool nullArray = false;
  } cases[] = {
      {"empty slot", 0x00001FFFu, nullptr, kvErrInvalidSession, 0},
      {"null array pointer", session_, nullptr, kvErrNullArgument, 0, true},
      {"guard held", session_, [](nKVSVAPI100::tSessionSlot *s) { s->guard = 1; },
       kvErrSessionBusy, 1},
      {"slot being torn down",
       session_, [](nKVSVAPI100::tSessionSlot *s) { s->guard = 0, s->slotValid = 0; },
       kvErrSessionBusy, 0},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    if (c.before) c.before(slot);
    kvsimLogClear();
    EXPECT_EQ(kvsvReadSignalSinglePoint(c.session, c.nullArray ? nullptr : &values_), c.expected);
    EXPECT_EQ(Values(values_), (std::vector<double>{1.25, 2.5}));
    EXPECT_EQ(kvsimLogCount(), 0);
    EXPECT_EQ(slot->guard.load(), c.guardAfter);
  }
}

TEST_F(SignalSinglePoint, OnlyTheLowSixteenBitsChooseTheSlot) {
  // Other high bits reach the same slot; the driver, given that handle, judges it.
  const uint32_t alias = session_ ^ 0x00FF0000u;
  kvsimLogClear();
  EXPECT_EQ(kvsvReadSignalSinglePoint(alias, &values_), kvsimErrInvalidSession);
  kvsimCallRecord record{};
  ASSERT_EQ(kvsimLogEntry(0, &record), 1);
  EXPECT_EQ(record.object, alias);
  EXPECT_EQ(Slot(session_)->guard.load(), 0u);
}

class SignalWrite : public SlotFixture {};

TEST_F(SignalWrite, ValuesReachTheNetworkAndAnEmptyOrMissingArrayGoesDownAsSizeZero) {
  uint32_t out = 0;
  ASSERT_EQ(kvCreateSession(":memory:", "", "Torque,Gear", "CAN1", kvMode_SignalOutSinglePoint, &out),
            0);
  const double v[] = {312.75, 4};
  SvHandle array = Keep(svsimMakeDoubleArray(v, 2));
  ASSERT_EQ(kvsvWriteSignalSinglePoint(out, array), 0);
  double seen[2] = {0, 0};
  ASSERT_EQ(kvsimGetSignalValues(out, seen, 2), 2);
  EXPECT_EQ(seen[0], 312.75);
  EXPECT_EQ(seen[1], 4);
  EXPECT_EQ(LastCall().size1, 16u);
  SvHandle empty = Keep(svsimMakeDoubleArray(nullptr, 0));
  for (SvHandle none : {empty, static_cast<SvHandle>(nullptr)}) {
    kvsimLogClear();
    kvsvWriteSignalSinglePoint(out, none);
    ASSERT_EQ(kvsimLogCount(), 1);
    EXPECT_STREQ(LastCall().function, "kvWriteSignalSinglePoint");
    EXPECT_EQ(LastCall().size1, 0u);
  }
}

TEST_F(SignalWrite, BadSessionIsJudgedByTheDriver) {
  const double v[] = {1};
  SvHandle array = Keep(svsimMakeDoubleArray(v, 1));
  EXPECT_EQ(kvsvWriteSignalSinglePoint(0x00002001u, array), kvsimErrInvalidSession);
  EXPECT_EQ(kvsimCountCalls("kvWriteSignalSinglePoint"), 1);
}

}  // namespace
