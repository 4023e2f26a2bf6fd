// A process in which the managers' mutexes could not be made: every export that needs one reports
// the failure and returns, touching nothing. This program refuses priority inheritance to every
// mutex made before its tests start, which is when the managers are built.
#include <gtest/gtest.h>

#include <set>
#include <string>

#include "session/kvorutility.h"
#include "session/system_manager.h"
#include "support/refused_mutexes.h"
#include "support/session_fixture.h"

namespace {

using namespace nKVSVAPI100;

TEST(FailedManagers, EachExportReportsFromItsOwnLineAndTouchesNothing) {
  kvsvtest::gRefuseMutexes = false;
  kvsimReset();
  svsimReset();
  kvsvtest::cFakeErrorLog log;
  SvHandle name = svsimMakeString("CAN1");
  uint32_t out = 0x12345678u;
  uint64_t reserved1 = 7, reserved2 = 7;
  kvsvRefnum reference = 0;
  const std::string text = "X";
  const int32_t results[] = {
      RegisterReference(kClassSession, name, 1, &reference),
      UnregisterReference(77),
      UnregisterReferenceByName(kClassDevice, &text),
      kvsvSessionManualCreate(":memory:", "", "A", "CAN1", kvMode_SignalInSinglePoint, &reference),
      kvsvSessionClose(0x20010001u),
      kvsvSessionClear(0x20010001u, 0),
      kvsvSessionOpen(&name, &out, 0),
      kvsvSystemOpen(nullptr, &out),
      kvsvSystemClose(0x01000000u),
      kvsvSystemManualClose(&reserved1, &reserved2),
      kvsvDeviceOpen(&name, &out),
      kvsvDeviceClose(0x01000010u),
      kvsvInterfaceOpen(&name, &out),
      kvsvInterfaceClose(0x01000001u),
  };
  svDisposeHandle(name);
  for (int32_t result : results) EXPECT_EQ(result, kvErrInternal);
  EXPECT_EQ(out, 0x12345678u);
  EXPECT_EQ(reserved1 + reserved2, 14u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimLogCount(), 0) << "nothing reached the driver";
  EXPECT_EQ(svsimRefCount(), 0);
  // These two test the manager themselves and leave their input alone.
  EXPECT_FALSE(RemoveErrorChild(0x20010001u));
  EXPECT_EQ(RedirectSystemHandle(0x01990000u, kvPropSys_DevRefs), 0x01990000u);
  // The reference calls report the registration lock, the session exports their own place; the
  // system exports each a line of their own.
  const std::vector<uint32_t> lines = ReportLines(log);
  ASSERT_EQ(lines.size(), std::size(results));
  EXPECT_EQ(std::vector<uint32_t>(lines.begin(), lines.begin() + 7),
            (std::vector<uint32_t>{2462, 2579, 2730, 9107, 129, 9215, 74}));
  EXPECT_EQ(std::set<uint32_t>(lines.begin(), lines.end()).size(), lines.size());
  for (const auto &record : log.Records())
    EXPECT_EQ(record.value.info, static_cast<uint32_t>(-52003)) << record.value.Line();
}

}  // namespace
