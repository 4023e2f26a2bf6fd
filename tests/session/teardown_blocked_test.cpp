// A session ends while a call is blocked in the driver on it: the driver session goes first, the
// call comes back and leaves its guard, and only then is the slot freed.
#include <gtest/gtest.h>

#include <thread>

#include "kvsim.h"
#include "kvsvapi.h"
#include "session/object_class.h"
#include "session/system_manager.h"
#include "support/session_helpers.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

class TeardownBlocked : public SlotFixture {
 protected:
  // A read of `handle` parked inside the driver, holding the slot's guard.
  std::thread BlockedRead(uint32_t handle, kvsvStatus &status, SvHandle &values) {
    EXPECT_EQ(kvsimHold("kvReadSignalSinglePoint"), 0);
    std::thread reader(
        [handle, &status, &values] { status = kvsvReadSignalSinglePoint(handle, &values); });
    EXPECT_EQ(kvsimWaitParked("kvReadSignalSinglePoint", 1), 1);
    EXPECT_EQ(Slot(handle)->guard.load(), 1u);
    return reader;
  }
};

TEST_F(TeardownBlocked, TheBlockedReadReturnsBeforeTheSlotIsFreed) {
  // The program closes the session, or the host's clean-up thread aborts it as the program stops.
  for (const bool byAbort : {false, true}) {
    SCOPED_TRACE(byAbort ? "abort" : "close");
    const auto made = kvsvtest::CreateManual("A,B", kvMode_SignalInSinglePoint, "CAN1");
    ASSERT_EQ(made.status, 0);
    kvsvStatus status = 0;
    SvHandle values = nullptr;
    std::thread reader = BlockedRead(made.handle, status, values);
    if (byAbort) {
      // What a blocking call registers before it enters the driver.
      ASSERT_EQ(svSetCleanupProc(kvsvSessionAbort, made.handle, 6), 0);
      SvsimEndReport report{};
      ASSERT_EQ(svsimEndProgram(&report), 0);
      EXPECT_EQ(report.cleanupsRun, 1);
    } else {
      EXPECT_EQ(kvsvSessionClose(made.handle), 0);
    }
    reader.join();
    EXPECT_EQ(status, kvsimErrSessionCleared);
    EXPECT_EQ(Slot(made.handle), nullptr);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_EQ(kvsvReadSignalSinglePoint(made.handle, &values), kvErrInvalidSession);
    kvsimRelease("kvReadSignalSinglePoint");
    Keep(values);
    svsimEndProgram(nullptr);
  }
}

TEST_F(TeardownBlocked, AbortOfAnErrorHandleOnlyFreesTheGuard) {
  uint32_t device = 0;
  SvHandle name = Keep(svsimMakeString("NoSuchDevice"));
  ASSERT_EQ(kvsvDeviceOpen(&name, &device), 0);
  ASSERT_EQ(ClassFromHandle(static_cast<int32_t>(device)), kClassSession);
  ASSERT_EQ(PlaceSlot(device), 0);
  Slot(device)->guard = 1;  // a call in progress on the error handle
  EXPECT_EQ(kvsvSessionAbort(device), 0);
  ASSERT_NE(Slot(device), nullptr);
  EXPECT_EQ(Slot(device)->guard.load(), 0u);
  EXPECT_FALSE(RemoveErrorChild(device));  // the abort took the error child away
  uint64_t out1 = 1, out2 = 1;
  kvsvSystemManualClose(&out1, &out2);
}

}  // namespace
