// The process-wide log behind the internal-error reporter, with its directory relocated into a
// directory of this test: two threads report before the log exists, one builds it (held inside
// the driver's system open) while the other waits in short sleeps, and both rows are written.
#include <gtest/gtest.h>

#include <condition_variable>
#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <mutex>
#include <set>
#include <string>
#include <thread>

#include "core/internal_error.h"
#include "diagnostics/error_log.h"
#include "diagnostics/temp_dir.h"
#include "kvsim.h"

namespace {

// Every nanosleep of this program is counted, so that the test knows when the second reporter
// is waiting for the first.
struct tSleeps {
  std::mutex mutex;
  std::condition_variable changed;
  int count = 0;
} gSleeps;

// The relocation library maps the shared state directory below this root; it must be set before
// the first directory lookup, hence at load.
struct tRelocatedRoot {
  tRelocatedRoot() {
    std::filesystem::create_directories(dir.Path() + "/var/lib/kvor/log");
    setenv("KVSV_TEST_RELOCATION_ROOT", dir.Path().c_str(), 1);
  }
  std::string LogFile() const {
    return dir.Path() + "/var/lib/kvor/log/kvorErr_diagnostics_concurrency_tests.log";
  }
  kvsvtest::cTempDir dir;
} gRoot;

}  // namespace

extern "C" int nanosleep(const timespec *, timespec *) {
  {
    std::lock_guard<std::mutex> lock(gSleeps.mutex);
    ++gSleeps.count;
  }
  gSleeps.changed.notify_all();
  std::this_thread::yield();
  return 0;
}

namespace {

using namespace nKVSVAPI100;

uint32_t Location(uint32_t line) { return 0x80000000u | (13u << 26) | (9u << 16) | (3u << 14) | line; }

TEST(ErrorLogReporter, TwoThreadsReportingBeforeTheLogExistsLeaveTwoRows) {
  kvsimReset();
  ASSERT_EQ(kvsimHold("kvSystemOpen"), 0);
  Status results[2] = {0, 0};
  std::thread builder([&] { results[0] = ReportInternalError(13, 9, 1, 0x11); });
  ASSERT_EQ(kvsimWaitParked("kvSystemOpen", 1), 1);
  std::thread waiter([&] { results[1] = ReportInternalError(13, 9, 2, 0x22); });
  {
    std::unique_lock<std::mutex> lock(gSleeps.mutex);
    gSleeps.changed.wait(lock, [] { return gSleeps.count >= 1; });
  }
  kvsimRelease("kvSystemOpen");
  builder.join();
  waiter.join();
  EXPECT_EQ(results[0], static_cast<Status>(0xBFF63001));
  EXPECT_EQ(results[1], static_cast<Status>(0xBFF63001));
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 1);
  EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1);
  EXPECT_EQ(GetErrorLog(), cErrorLog::GetErrorLog());

  const std::string file = kvsvtest::ReadFile(gRoot.LogFile());
  ASSERT_EQ(file.size(), 9u * 128u);
  EXPECT_EQ(file.substr(13, 4), "0002");
  EXPECT_EQ(file.substr(3 * 128, 22), "KVOR driver 24.5.0f49 ");
  // The waiter may write its row before the builder writes its own: the order of the two rows
  // is free, their numbers and contents are not.
  std::multiset<std::string> tails;
  for (uint32_t line = 1; line <= 2; ++line) {
    const std::string row = file.substr((6 + line) * 128, 128);
    EXPECT_EQ(row.substr(0, 4), line == 1 ? "0001" : "0002");
    EXPECT_EQ(row.substr(35, 29), "Error         System Service ");
    tails.insert(row.substr(94));
  }
  std::multiset<std::string> expected;
  for (uint32_t line = 1; line <= 2; ++line) {
    char text[64];
    std::snprintf(text, sizeof text, "      0x%08x      0x%08x \n", line == 1 ? 0x11u : 0x22u,
                  Location(line));
    expected.insert(text);
  }
  EXPECT_EQ(tails, expected);

  // Once built, the log takes every further report without building again.
  EXPECT_EQ(ReportInternalError(13, 9, 3, 0), static_cast<Status>(0xBFF63001));
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 1);
  EXPECT_EQ(kvsvtest::ReadFile(gRoot.LogFile()).size(), 10u * 128u);
}

}  // namespace
