// Manual creation, close, clear and the end of a program, through the exports as a host calls them.
#include <gtest/gtest.h>

#include <string>

#include "kvsim.h"
#include "kvsvapi.h"
#include "support/session_helpers.h"
#include "svsim.h"

namespace {

using kvsvtest::CreateManual;
using kvsvtest::HasSlot;
using kvsvtest::ManualSessionName;

class SessionLife : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
  }
  void TearDown() override {
    // Whatever a test left open ends as the host ends a program.
    svsimSetRefStatus(0);
    svsimEndProgram(nullptr);
    kvsimReset();
    svsimReset();
  }
};

TEST_F(SessionLife, ManualCreateRegistersTheSessionByItsHandleAndMakesItsSlot) {
  const auto made = CreateManual("Speed,Gear", kvMode_SignalInSinglePoint, "CAN1");
  ASSERT_EQ(made.status, 0);
  ASSERT_NE(made.handle, 0u);
  SvsimRefInfo info{};
  ASSERT_EQ(svsimFindRef(ManualSessionName(made.handle).c_str(), &info), 1);
  EXPECT_STREQ(info.className, "KVOR Session");
  EXPECT_STREQ(info.closeName, "kvsvSessionClose");
  EXPECT_EQ(kvsimOpenSessionCount(), 1);
  const double v[] = {88.0, 4.0};
  ASSERT_EQ(kvsimSetSignalValues(made.handle, v, 2), 2);
  SvHandle values = nullptr;
  EXPECT_EQ(kvsvReadSignalSinglePoint(made.handle, &values), 0);
  double seen[2] = {0, 0};
  EXPECT_EQ(svsimReadDoubleArray(values, seen, 2), 2);
  EXPECT_EQ(seen[0], 88.0);
  svDisposeHandle(values);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

TEST_F(SessionLife, SessionRefusedByTheDriverIsRegisteredAsHandleZero) {
  const auto made = CreateManual("Speed", kvMode_SignalInSinglePoint, "CAN9");
  EXPECT_EQ(made.status, kvsimErrUnknownInterface);
  SvsimRefInfo info{};
  ASSERT_EQ(svsimFindRef("___kvorSesn#00000000", &info), 1);
  EXPECT_EQ(info.cookie, made.reference);
  EXPECT_EQ(info.handle, 0u);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

TEST_F(SessionLife, DriverWarningOnCreateIsLost) {
  ASSERT_EQ(kvsimFailCall("kvCreateSession", 0x3FF62005, 1), 0);
  const auto made = CreateManual("Speed", kvMode_SignalInSinglePoint, "CAN1");
  EXPECT_EQ(made.status, 0);
  EXPECT_TRUE(HasSlot(made.handle));
}

TEST_F(SessionLife, FailedRegistrationClearsTheNewSession) {
  svsimSetRefStatus(-9);
  kvsvRefnum reference = 0;
  EXPECT_EQ(kvsvSessionManualCreate(":memory:", "", "Speed", "CAN1", kvMode_SignalInSinglePoint,
                                    &reference),
            kvErrInternal);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
}

TEST_F(SessionLife, HostMemoryFailuresAreReportedAsOutOfMemory) {
  // The name handle itself: no session is made at all.
  svsimFailAllocAt(1);
  kvsvRefnum reference = 0;
  EXPECT_EQ(
      kvsvSessionManualCreate(":memory:", "", "A", "CAN1", kvMode_SignalInSinglePoint, &reference),
      kvErrOutOfMemory);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
  // The name cannot be printed: the session made is cleared again and nothing is registered.
  svsimFailResizeAt(1);
  EXPECT_EQ(
      kvsvSessionManualCreate(":memory:", "", "A", "CAN1", kvMode_SignalInSinglePoint, &reference),
      kvErrOutOfMemory);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(svsimRefCount(), 0);
}

TEST_F(SessionLife, CloseClearsTheDriverSessionOnceAndFreesTheSlot) {
  const auto made = CreateManual("A", kvMode_SignalInSinglePoint, "CAN1");
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionClose(made.handle), 0);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_FALSE(HasSlot(made.handle));
  EXPECT_EQ(kvsvSessionClose(made.handle), 0);  // a second close finds nothing to free
}

TEST_F(SessionLife, CloseOfHandleZeroDoesNothing) {
  EXPECT_EQ(kvsvSessionClose(0), 0);
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(SessionLife, ClearRemovesTheReferenceAndClosesWhateverTheHostSays) {
  const struct {
    const char *what;
    int32_t hostStatus;
    kvsvStatus expected;
  } cases[] = {
      {"removed", 0, 0}, {"warning dropped", 5, 0}, {"failure returned", -4, kvErrInternal}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    const auto made = CreateManual("A", kvMode_SignalInSinglePoint, "CAN2");
    svsimSetRefStatus(c.hostStatus);
    EXPECT_EQ(kvsvSessionClear(made.handle, made.reference), c.expected);
    svsimSetRefStatus(0);
    if (c.hostStatus == 0) {
      EXPECT_EQ(svsimRefCount(), 0);
    }
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_FALSE(HasSlot(made.handle));
    svsimReset();
  }
}

TEST_F(SessionLife, ClearWithHandleZeroOnlyRemovesTheReference) {
  const auto made = CreateManual("A", kvMode_SignalInSinglePoint, "CAN1");
  EXPECT_EQ(kvsvSessionClear(0, made.reference), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 1);
  EXPECT_TRUE(HasSlot(made.handle));
  EXPECT_EQ(kvsvSessionClose(made.handle), 0);
}

TEST_F(SessionLife, EndingTheProgramClosesWhatItHeld) {
  const auto a = CreateManual("A", kvMode_SignalInSinglePoint, "CAN1");
  const auto b = CreateManual("B", kvMode_SignalOutSinglePoint, "CAN2");
  ASSERT_EQ(kvsimOpenSessionCount(), 2);
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.closesCalled, 2);
  EXPECT_EQ(report.closesMissing, 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_FALSE(HasSlot(a.handle));
  EXPECT_FALSE(HasSlot(b.handle));
}

TEST_F(SessionLife, AnyReferenceGivenToTheSessionCloseGoesToItsOwnClose) {
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsvGetSystemRefCount(), 1u);
  EXPECT_EQ(kvsvSessionClose(system), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
}

}  // namespace
