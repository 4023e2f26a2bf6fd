// A process in which the managers' mutexes could not be made: every export that needs one reports
// the failure and returns, touching nothing. This program refuses priority inheritance to every
// mutex made before its tests start, which is when the managers are built.
#include <gtest/gtest.h>

#include <string>

#include "kvsim.h"
#include "kvsvapi.h"
#include "session/kvorutility.h"
#include "session/session_manager.h"
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
  }
  kvsvtest::cFakeErrorLog log_;
};

TEST_F(FailedManagers, StatusBlocksHoldTheMutexFailure) {
  for (const tStatusBlock *block :
       {&gSessionManager.status, &gSystemManager.status, &gRegistrationLock.status}) {
    EXPECT_EQ(block->code, -52003);
    EXPECT_STREQ(block->component, "kvsvapi");
    EXPECT_EQ(block->line, 655u);
  }
}

TEST_F(FailedManagers, EachExportReportsWithItsOwnLineAndTouchesNothing) {
  kvsvRefnum reference = 0;
  EXPECT_EQ(kvsvSessionManualCreate(":memory:", "", "A", "CAN1", kvMode_SignalInSinglePoint,
                                    &reference),
            kvErrInternal);
  EXPECT_EQ(kvsvSessionClose(0x20010001u), kvErrInternal);
  EXPECT_EQ(kvsvSessionClear(0x20010001u, 0), kvErrInternal);
  uint32_t system = 0;
  kvsvSystemOpen(nullptr, &system);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimLogCount(), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  const struct {
    uint32_t file;
    uint32_t line;
  } expected[] = {{9, 9107}, {10, 129}, {9, 9215}};
  const auto records = log_.Records();
  ASSERT_EQ(records.size(), 4u);  // the system open reports too, with a line of its own
  for (size_t i = 0; i < 3; ++i) {
    EXPECT_EQ(records[i].value.File(), expected[i].file);
    EXPECT_EQ(records[i].value.Line(), expected[i].line);
    EXPECT_EQ(records[i].value.info, kMutexFailed);
  }
}

TEST_F(FailedManagers, ReferenceCallsReportTheRegistrationLock) {
  SvHandle name = svsimMakeString("X");
  SvRefnum reference = 0;
  EXPECT_EQ(RegisterReference(kClassSession, name, 1, &reference), kvErrInternal);
  EXPECT_EQ(UnregisterReference(77), kvErrInternal);
  const std::string text = "X";
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), kvErrInternal);
  EXPECT_EQ(svsimRefCount(), 0);
  const auto records = log_.Records();
  ASSERT_EQ(records.size(), 3u);
  EXPECT_EQ(records[0].value.Line(), 2462u);
  EXPECT_EQ(records[1].value.Line(), 2579u);
  EXPECT_EQ(records[2].value.Line(), 2730u);
  for (const auto &record : records) EXPECT_EQ(record.value.info, kMutexFailed);
  svDisposeHandle(name);
}

}  // namespace
