// A process in which the managers' mutexes could not be made: every export that needs one reports
// the failure and returns, touching nothing. This program refuses priority inheritance to every
// mutex made before its tests start, which is when the managers are built.
#include <gtest/gtest.h>

#include <set>
#include <string>
#include <utility>

#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "session/kvorutility.h"
#include "session/system_manager.h"
#include "support/fake_error_log.h"
#include "support/refused_mutexes.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

constexpr uint32_t kMutexFailed = static_cast<uint32_t>(-52003);

class FailedManagers : public testing::Test {
 protected:
  void SetUp() override {
    kvsvtest::gRefuseMutexes = false;
    kvsimReset();
    svsimReset();
    name_ = svsimMakeString("CAN1");
  }
  void TearDown() override { svDisposeHandle(name_); }
  kvsvtest::cFakeErrorLog log_;
  SvHandle name_ = nullptr;
};

TEST_F(FailedManagers, EachExportReportsFromItsOwnLineAndTouchesNothing) {
  uint32_t out = 0x12345678u;
  uint64_t reserved1 = 7, reserved2 = 7;
  kvsvRefnum reference = 0;
  const std::string text = "X";
  const int32_t results[] = {
      RegisterReference(kClassSession, name_, 1, &reference),
      UnregisterReference(77),
      UnregisterReferenceByName(kClassDevice, &text),
      kvsvSessionManualCreate(":memory:", "", "A", "CAN1", kvMode_SignalInSinglePoint, &reference),
      kvsvSessionClose(0x20010001u),
      kvsvSessionClear(0x20010001u, 0),
      kvsvSessionOpen(&name_, &out, 0),
      kvsvSystemOpen(nullptr, &out),
      kvsvSystemClose(0x01000000u),
      kvsvSystemManualClose(&reserved1, &reserved2),
      kvsvDeviceOpen(&name_, &out),
      kvsvDeviceClose(0x01000010u),
      kvsvInterfaceOpen(&name_, &out),
      kvsvInterfaceClose(0x01000001u),
  };
  for (int32_t result : results) EXPECT_EQ(result, kvErrInternal);
  EXPECT_EQ(out, 0x12345678u);
  EXPECT_EQ(reserved1 + reserved2, 14u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimLogCount(), 0) << "nothing reached the driver";
  EXPECT_EQ(svsimRefCount(), 0);
  // These two test the manager themselves and leave their input alone.
  EXPECT_FALSE(RemoveErrorChild(0x20010001u));
  EXPECT_EQ(RedirectSystemHandle(0x01990000u, kvPropSys_DevRefs), 0x01990000u);

  const auto records = log_.Records();
  ASSERT_EQ(records.size(), std::size(results));
  // The reference calls report the registration lock, the session exports their own place.
  const std::pair<uint32_t, uint32_t> known[] = {{16, 2462}, {16, 2579}, {16, 2730}, {9, 9107},
                                                 {10, 129},  {9, 9215},  {10, 74}};
  std::set<std::pair<uint32_t, uint32_t>> places;
  for (size_t i = 0; i < records.size(); ++i) {
    const auto place = std::make_pair(records[i].value.File(), records[i].value.Line());
    EXPECT_TRUE(i >= std::size(known) || place == known[i]) << i;
    EXPECT_EQ(records[i].value.info, kMutexFailed) << i;
    places.insert(place);
  }
  EXPECT_EQ(places.size(), records.size()) << "each export reports from its own line";
}

}  // namespace
