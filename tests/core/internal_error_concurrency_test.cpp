// Reports made on several threads before the log exists: one thread builds the log while the
// others wait their turn in short sleeps, and every report is written.
#include <gtest/gtest.h>

#include <algorithm>
#include <cerrno>
#include <condition_variable>
#include <ctime>
#include <mutex>
#include <thread>
#include <vector>

#include "support/fake_error_log.h"
#include "core/internal_error.h"

namespace {

// Every nanosleep of this program comes here: the reporter's waits are recorded, and the first
// one is cut short as if by a signal, with 0.4 ms left.
struct tSleepRecorder {
  std::mutex mutex;
  std::condition_variable changed;
  std::vector<timespec> requests;
} gSleeps;

constexpr long kInterruptedRemainderNs = 400000;

void ClearSleeps() {
  std::lock_guard<std::mutex> lock(gSleeps.mutex);
  gSleeps.requests.clear();
}

void WaitForSleeps(size_t count) {
  std::unique_lock<std::mutex> lock(gSleeps.mutex);
  gSleeps.changed.wait(lock, [count] { return gSleeps.requests.size() >= count; });
}

std::vector<timespec> Sleeps() {
  std::lock_guard<std::mutex> lock(gSleeps.mutex);
  return gSleeps.requests;
}

}  // namespace

extern "C" int nanosleep(const timespec *requested, timespec *remaining) {
  bool interrupt = false;
  {
    std::lock_guard<std::mutex> lock(gSleeps.mutex);
    gSleeps.requests.push_back(*requested);
    interrupt = gSleeps.requests.size() == 1;
  }
  gSleeps.changed.notify_all();
  if (interrupt) {
    remaining->tv_sec = 0;
    remaining->tv_nsec = kInterruptedRemainderNs;
    errno = EINTR;
    return -1;
  }
  std::this_thread::yield();
  return 0;
}

namespace {

using namespace nKVSVAPI100;
using kvsvtest::cFakeErrorLog;

class ReportBeforeTheLogExists : public testing::Test {
 protected:
  void SetUp() override { ClearSleeps(); }
};

TEST_F(ReportBeforeTheLogExists, TheSecondThreadSleepsInMillisecondStepsUntilTheLogIsBuilt) {
  cFakeErrorLog log;
  // The build lasts until the other thread has slept twice: once cut short, once for the rest.
  log.SetBuildHook([] { WaitForSleeps(2); });

  Status results[2] = {0, 0};
  std::thread first([&] { results[0] = ReportInternalError(13, 9, 1, 0); });
  std::thread second([&] { results[1] = ReportInternalError(13, 9, 2, 0); });
  first.join();
  second.join();

  EXPECT_EQ(results[0], kvErrInternal);
  EXPECT_EQ(results[1], kvErrInternal);
  EXPECT_EQ(log.Builds(), 1);
  std::vector<uint32_t> lines;
  for (const auto &record : log.Records()) lines.push_back(record.value.Line());
  std::sort(lines.begin(), lines.end());
  EXPECT_EQ(lines, (std::vector<uint32_t>{1, 2}));

  const std::vector<timespec> sleeps = Sleeps();
  ASSERT_GE(sleeps.size(), 2u);
  EXPECT_EQ(sleeps[0].tv_sec, 0);
  EXPECT_EQ(sleeps[0].tv_nsec, 1000000);
  // The interrupted sleep resumes with what was left of it.
  EXPECT_EQ(sleeps[1].tv_sec, 0);
  EXPECT_EQ(sleeps[1].tv_nsec, kInterruptedRemainderNs);
  for (size_t i = 2; i < sleeps.size(); ++i) {
    EXPECT_EQ(sleeps[i].tv_sec, 0);
    EXPECT_EQ(sleeps[i].tv_nsec, 1000000);
  }
}

TEST_F(ReportBeforeTheLogExists, ManyThreadsBuildOnceAndWriteEveryReport) {
  constexpr int kThreads = 8;
  cFakeErrorLog log;
  log.SetBuildHook([] { WaitForSleeps(1); });

  std::vector<Status> results(kThreads, 0);
  std::vector<std::thread> threads;
  for (int i = 0; i < kThreads; ++i)
    threads.emplace_back([&results, i] { results[i] = ReportInternalError(13, 9, 100 + i, 0); });
  for (auto &thread : threads) thread.join();

  for (Status result : results) EXPECT_EQ(result, kvErrInternal);
  EXPECT_EQ(log.Builds(), 1);
  EXPECT_EQ(log.Records().size(), static_cast<size_t>(kThreads));
}

}  // namespace
