// The process-wide log behind the internal-error reporter, with its directory relocated into a
// directory of this test: two threads report before the log exists, one builds it (held inside
// the driver's system open) while the other waits in short sleeps, and both rows are written.
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <set>
#include <string>
#include <thread>

#include "core/internal_error.h"
#include "kvsim.h"
#include "support/sleep_recorder.h"
#include "support/temp_dir.h"

namespace {

// The relocation library maps the shared state directory below this root; it must be set before
// the first directory lookup, hence at load.
struct tRelocatedRoot {
  tRelocatedRoot() {
    std::filesystem::create_directories(dir.Path() + "/var/lib/kvor/log");
    setenv("KVSV_TEST_RELOCATION_ROOT", dir.Path().c_str(), 1);
  }
  kvsvtest::cTempDir dir;
} gRoot;

using namespace nKVSVAPI100;

TEST(ErrorLogReporter, TwoThreadsReportingBeforeTheLogExistsLeaveTwoRows) {
  const std::string path =
      gRoot.dir.Path() + "/var/lib/kvor/log/kvorErr_diagnostics_concurrency_tests.log";
  kvsimReset();
  ASSERT_EQ(kvsimHold("kvSystemOpen"), 0);
  std::thread builder([] { EXPECT_EQ(ReportInternalError(13, 9, 1, 0x11), kvErrInternal); });
  ASSERT_EQ(kvsimWaitParked("kvSystemOpen", 1), 1);
  std::thread waiter([] { EXPECT_EQ(ReportInternalError(13, 9, 2, 0x22), kvErrInternal); });
  kvsvtest::WaitForSleeps(1);
  kvsimRelease("kvSystemOpen");
  builder.join();
  waiter.join();
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 1);
  EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1);

  const std::string file = kvsvtest::ReadFile(path);
  ASSERT_EQ(file.size(), 9u * 128u);
  EXPECT_EQ(file.substr(13, 4), "0002");
  EXPECT_EQ(file.substr(3 * 128, 22), "KVOR driver 24.5.0f49 ");
  // The waiter may write its row before the builder writes its own: the order of the two rows
  // is free, their numbers and contents are not. Info: failed, component 13, file 9, system
  // service, line.
  EXPECT_EQ(file.substr(7 * 128, 4) + file.substr(8 * 128, 4), "00010002");
  const std::string tail = "Error         System Service        13         9          ";
  EXPECT_EQ(
      (std::multiset<std::string>{file.substr(7 * 128 + 35, 93), file.substr(8 * 128 + 35, 93)}),
      (std::multiset<std::string>{tail + "1      0x00000011      0xb409c001 \n",
                                  tail + "2      0x00000022      0xb409c002 \n"}));

  // Once built, the log takes every further report without building again.
  EXPECT_EQ(ReportInternalError(13, 9, 3, 0), kvErrInternal);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 1);
  EXPECT_EQ(kvsvtest::ReadFile(path).size(), 10u * 128u);
}

}  // namespace
