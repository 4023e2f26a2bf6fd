// A built application may start before the driver takes sessions: its first project open tries
// again every 10 ms for about 8 seconds. This program's nanosleep returns at once and keeps the
// time asked for, so that the whole wait passes without waiting.
#include <gtest/gtest.h>

#include <ctime>
#include <mutex>
#include <string>

#include "paths/paths_test_support.h"
#include "paths/relocation_root.h"
#include "session/project_session_support.h"
#include "session/session_manager.h"

namespace {

int gSleeps = 0;
long long gSleptNs = 0;
long long gLastRequestNs = 0;

}  // namespace

extern "C" int nanosleep(const timespec *requested, timespec *) {
  ++gSleeps;
  gLastRequestNs = requested->tv_sec * 1000000000LL + requested->tv_nsec;
  gSleptNs += gLastRequestNs;
  return 0;
}

namespace {

using kvsvtest::Entry;

const kvsvtest::cRelocationRoot gRoot;
const int32_t kRefused = static_cast<int32_t>(0xBFF62099);

class ProjectRetry : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
    svsimSetAppPath(application_.Path().c_str());
  }
  void TearDown() override {
    if (opened_.handle != 0) kvsvSessionClose(opened_.handle);
    {
      std::lock_guard<nKVSVAPI100::cRecursiveMutex> lock(*nKVSVAPI100::gSessionManager.mutex);
      ASSERT_TRUE(nKVSVAPI100::gSessionManager.interfaces.empty());
    }
    kvsimReset();
    svsimReset();
  }

  // The same file beside the application and in the development directory.
  void WriteFile(const std::string &text) {
    application_.WriteFile("kvorSession.txt", text);
    kvsvtest::WriteText(gRoot.Path() + "/var/lib/kvor/kvorSession.txt", text);
  }

  kvsvtest::cTempDir application_;
  kvsvtest::tOpened opened_;
};

TEST_F(ProjectRetry, BuiltApplicationRetriesTheFirstCreation) {
  struct Case {
    const char *what;
    int32_t bound, runTime, fullFeature;
    int32_t refusals;  // -1: every creation
    int creates;
    int sleeps;
    int32_t expected;
  } cases[] = {
      {"built: refused three times", 1, 1, 0, 3, 4, 3, 0},
      {"built on a full-featured engine: taken at the last attempt", 1, 0, 1, 799, 800, 799, 0},
      {"built: refused for good", 1, 1, 0, -1, 800, 799, kRefused},
      {"development environment", 0, 0, 0, 1, 1, 0, kRefused},
      {"bound, not under a run-time engine", 1, 0, 0, 1, 1, 0, kRefused},
  };
  WriteFile(Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle"));
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    svsimSetRunMode(c.bound, c.runTime, c.fullFeature);
    ASSERT_EQ(kvsimFailCall("kvCreateSession", kRefused, c.refusals), 0);
    gSleeps = 0;
    gSleptNs = 0;
    kvsimLogClear();
    opened_ = kvsvtest::Open("A");
    EXPECT_EQ(opened_.status, 0);
    EXPECT_EQ(kvsvtest::UseStatus(opened_.handle), c.expected);
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), c.creates);
    EXPECT_EQ(gSleeps, c.sleeps);
    EXPECT_EQ(gSleptNs, c.sleeps * 10000000LL);
    kvsimClearFailures();
    EXPECT_EQ(kvsvSessionClose(opened_.handle), 0);
    opened_ = {};
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
  }
  // Refused for good: about 8 seconds of waiting, in 10 ms steps.
  EXPECT_EQ(gLastRequestNs, 10000000LL);
}

TEST_F(ProjectRetry, SiblingsAreCreatedOnce) {
  WriteFile(Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") +
            Entry("Bad", "0 0 0 0 CAN1 a,,b Body Vehicle"));
  svsimSetRunMode(1, 1, 1);
  opened_ = kvsvtest::Open("A");
  EXPECT_EQ(kvsvtest::UseStatus(opened_.handle), 0);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 2);
  EXPECT_EQ(gSleeps, 0);
}

}  // namespace
