// Handle classes, host references and the close dispatch, against the host and driver stand-ins.
#include "session/kvorutility.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "support/fake_error_log.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

TEST(ClassFromHandle, EveryKindOfHandle) {
  const struct {
    uint32_t handle;
    uint32_t expected;
  } cases[] = {
      {0x00000000u, kClassNone},    {0x01000000u, kClassSystem},
      {0x01000010u, kClassDevice},  {0x01000001u, kClassInterface},
      {0x01AB1200u, kClassDevice},  {0x01AB120Fu, kClassInterface},
      {0x0F000000u, kClassNone},    {0x0F123456u, kClassNone},
      {0x02000000u, kClassSession}, {0x20010001u, kClassSession},
      {0x00000001u, kClassSession}, {0x80000000u, kClassDatabase},
      {0x83000000u, kClassSignal},  {0x8F000000u, kClassBareDatabase},
      {0xF8123456u, kClassPdu},     {0x81FFFFFFu, kClassCluster},
  };
  for (const auto &c : cases)
    EXPECT_EQ(ClassFromHandle(static_cast<int32_t>(c.handle)), c.expected) << std::hex << c.handle;
}

class References : public SlotFixture {
 protected:
  void SetUp() override {
    SlotFixture::SetUp();
    name_ = Keep(svsimMakeString("RefName"));
  }
  void TearDown() override {
    gReportImplicitClose = 0;
    SlotFixture::TearDown();
  }

  // The lines of the reports made so far, in their order.
  std::vector<uint32_t> ReportLines() const {
    std::vector<uint32_t> lines;
    for (const auto &record : log_.Records()) lines.push_back(record.value.Line());
    return lines;
  }

  kvsvtest::cFakeErrorLog log_;
  SvHandle name_ = nullptr;
};

TEST_F(References, EveryClassIsRegisteredWithItsNamesAndKeepFlag) {
  const struct {
    uint32_t objectClass;
    const char *className;
    const char *open;
    const char *close;
    int32_t keep;
  } cases[] = {
      {kClassDatabase, "KVOR Database", "kvsvdbDatabaseOpen", "kvsvdbDatabaseClose", 0},
      {kClassCluster, "KVOR Cluster", "kvsvdbClusterOpen", "kvsvdbClusterClose", 1},
      {kClassFrame, "KVOR Frame", "kvsvdbFrameOpen", "kvsvdbFrameClose", 1},
      {kClassSignal, "KVOR Signal", "kvsvdbSignalOpen", "kvsvdbSignalClose", 1},
      {kClassSubframe, "KVOR Subframe", "kvsvdbSubframeOpen", "kvsvdbSubframeClose", 1},
      {kClassEcu, "KVOR ECU", "kvsvdbEcuOpen", "kvsvdbEcuClose", 1},
      {kClassLinSchedule, "KVOR LIN Schedule", "kvsvdbLINSchedOpen", "kvsvdbLINSchedClose", 1},
      {kClassLinScheduleEntry, "KVOR LIN Schedule Entry", "kvsvdbLINSchedEntryOpen",
       "kvsvdbLINSchedEntryClose", 1},
      {kClassPdu, "KVOR PDU", "kvsvdbPDUOpen", "kvsvdbPDUClose", 1},
      {kClassSession, "KVOR Session", "kvsvSessionOpen", "kvsvSessionClose", 1},
      {kClassSystem, "KVOR System", "kvsvSystemOpen", "kvsvSystemClose", 0},
      {kClassDevice, "KVOR Device", "kvsvDeviceOpen", "kvsvDeviceClose", 0},
      {kClassInterface, "KVOR Interface", "kvsvInterfaceOpen", "kvsvInterfaceClose", 0},
  };
  uint32_t handle = 0x100;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.className);
    svsimReset();
    SvRefnum reference = 0;
    ASSERT_EQ(RegisterReference(c.objectClass, name_, ++handle, &reference), 0);
    SvsimRefInfo info{};
    ASSERT_EQ(svsimFindRef("RefName", &info), 1);
    EXPECT_EQ(info.cookie, reference);
    EXPECT_EQ(info.handle, handle);
    EXPECT_STREQ(info.kind, "kvor");
    EXPECT_STREQ(info.libraryPattern, "kvsvapi.*");
    EXPECT_STREQ(info.className, c.className);
    EXPECT_STREQ(info.openName, c.open);
    EXPECT_STREQ(info.closeName, c.close);
    EXPECT_EQ(info.keep, c.keep);
  }
  EXPECT_TRUE(log_.Records().empty());
}

TEST_F(References, FailuresAreReportedWithTheirLineAndLeaveNothingBehind) {
  const uint64_t liveBefore = svsimLiveHandles();
  SvRefnum reference = 0;
  EXPECT_EQ(RegisterReference(0xF0000, name_, 5, &reference), kvErrInternal);
  svsimSetRefStatus(-7);
  EXPECT_EQ(RegisterReference(kClassSession, name_, 5, &reference), kvErrInternal);
  svsimSetRefStatus(0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(svsimLiveHandles(), liveBefore);
  EXPECT_EQ(ReportLines(), (std::vector<uint32_t>{2451, 2536}));
  const auto records = log_.Records();
  ASSERT_EQ(records.size(), 2u);
  EXPECT_EQ(records[0].value.File(), 16u);
  EXPECT_EQ(records[0].value.info, 0u);
  EXPECT_EQ(records[1].value.info, static_cast<uint32_t>(-7));
}

TEST_F(References, NoTextHandleNoRegistration) {
  const uint64_t liveBefore = svsimLiveHandles();
  for (uint32_t n = 1; n <= 5; ++n) {
    SCOPED_TRACE(n);
    svsimFailAllocAt(n);
    SvRefnum reference = 0;
    EXPECT_EQ(RegisterReference(kClassSession, name_, 5, &reference), kvErrOutOfMemory);
    EXPECT_EQ(svsimRefCount(), 0);
    EXPECT_EQ(svsimLiveHandles(), liveBefore);
  }
}

TEST_F(References, RemovalByCookie) {
  EXPECT_EQ(UnregisterReference(0), 0);
  SvRefnum reference = 0;
  ASSERT_EQ(RegisterReference(kClassSession, name_, 9, &reference), 0);
  svsimSetRefStatus(3);  // a host warning
  EXPECT_EQ(UnregisterReference(reference), 0);
  svsimSetRefStatus(0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(UnregisterReference(reference), kvErrInternal);  // gone already
  EXPECT_EQ(ReportLines(), std::vector<uint32_t>{2596});
}

TEST_F(References, RemovalByNameFindsTheHostOperation) {
  SvRefnum reference = 0;
  ASSERT_EQ(RegisterReference(kClassDevice, name_, 0x01010100u, &reference), 0);
  const std::string other = "Other";
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &other), kvErrInternal);
  EXPECT_EQ(svsimRefCount(), 1);
  const std::string name = "RefName";
  EXPECT_EQ(UnregisterReferenceByName(kClassInterface, &name), kvErrInternal);  // other class
  EXPECT_EQ(UnregisterReferenceByName(kClassBareDatabase, &name), kvErrInternal);
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &name), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(ReportLines(), (std::vector<uint32_t>{2743, 2743, 2719}));
}

TEST_F(References, CloseDispatchSendsEachClassToItsClose) {
  // A session goes through the session close: cleared in the driver, its slot gone.
  const uint32_t session = MakeSession("A", kvMode_SignalInSinglePoint);
  kvsimLogClear();
  CloseDispatch(session, kClassSession);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
  EXPECT_EQ(Slot(session), nullptr);

  // A bare database goes to the driver's database close.
  CloseDispatch(0x8F000001u, kClassBareDatabase);
  kvsimCallRecord record{};
  ASSERT_EQ(kvsimLogEntry(kvsimLogCount() - 1, &record), 1);
  EXPECT_STREQ(record.function, "kvdbCloseDatabase");
  EXPECT_EQ(record.object, 0x8F000001u);

  // Classes without a close here are left alone.
  kvsimLogClear();
  CloseDispatch(0x82000001u, kClassFrame);
  CloseDispatch(5, kClassNone);
  EXPECT_EQ(kvsimLogCount(), 0);
  EXPECT_TRUE(log_.Records().empty());
}

TEST_F(References, ImplicitClosesOfSystemObjectsAreReportedWhenAsked) {
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  gReportImplicitClose = 1;
  CloseDispatch(system, kClassSystem);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(ReportLines(), std::vector<uint32_t>{2242});
  EXPECT_EQ(log_.Records().at(0).value.info, kClassSystem);
}

}  // namespace
