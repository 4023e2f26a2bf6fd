// A built application may start before the driver takes sessions: its first project open tries
// again every 10 ms for about 8 seconds. This program's nanosleep returns at once and adds up the
// time asked for, so that the whole wait passes without waiting.
#include <gtest/gtest.h>

#include <ctime>

#include "paths/paths_test_support.h"
#include "paths/relocation_root.h"
#include "session/project_session_support.h"

namespace {

int gSleeps = 0;
long long gSleptNs = 0;

}  // namespace

extern "C" int nanosleep(const timespec *requested, timespec *) {
  ++gSleeps;
  gSleptNs += requested->tv_sec * 1000000000LL + requested->tv_nsec;
  return 0;
}

namespace {

using kvsvtest::Entry;

const kvsvtest::cRelocationRoot gRoot;
const int32_t kRefused = static_cast<int32_t>(0xBFF62099);

TEST(ProjectRetry, OnlyABuiltApplicationRetriesAndOnlyTheFirstCreation) {
  kvsvtest::cTempDir application;
  const struct {
    int32_t bound, runTime, fullFeature;
    int32_t refusals;  // -1: every creation
    int creates;
    int32_t expected;
  } cases[] = {
      {1, 1, 0, 3, 4, 0},
      {1, 0, 1, 799, 800, 0},  // taken at the last attempt
      {1, 1, 0, -1, 800, kRefused},
      {0, 0, 0, 1, 1, kRefused},  // development environment
      {1, 0, 0, 1, 1, kRefused},  // bound, but under no run-time engine
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.bound << c.runTime << c.fullFeature << " " << c.refusals);
    kvsimReset();
    svsimReset();
    svsimSetAppPath(application.Path().c_str());
    svsimSetRunMode(c.bound, c.runTime, c.fullFeature);
    // The file beside the application and in the development directory; a sibling that the
    // driver refuses is tried once.
    const std::string file =
        Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") + Entry("Bad", "0 0 0 0 CAN1 ,, Body Vehicle");
    application.WriteFile("kvorSession.txt", file);
    kvsvtest::WriteText(gRoot.Path() + "/var/lib/kvor/kvorSession.txt", file);
    ASSERT_EQ(kvsimFailCall("kvCreateSession", kRefused, c.refusals), 0);
    gSleeps = 0;
    gSleptNs = 0;
    const uint32_t a = kvsvtest::Open("A");
    EXPECT_EQ(kvsvtest::UseStatus(a), c.expected);
    const int siblings = c.expected == 0 ? 1 : 0;
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), c.creates + siblings);
    EXPECT_EQ(gSleeps, c.creates - 1);
    EXPECT_EQ(gSleptNs, (c.creates - 1) * 10000000LL);
    EXPECT_EQ(kvsvSessionClose(a), 0);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
  }
  kvsimReset();
  svsimReset();
}

}  // namespace
