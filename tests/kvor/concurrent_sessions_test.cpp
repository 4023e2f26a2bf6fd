// Many threads creating, using and clearing sessions at once, while another uses whatever was made
// last: handles stay unique among open sessions, every session keeps its own values, and a call
// that meets a clear gives an answer it may give.
#include <atomic>
#include <mutex>
#include <set>
#include <thread>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorConcurrentSessions = KvorTest;

TEST_F(KvorConcurrentSessions, ThreadsCreatingUsingAndClearingNeverShareLowBits) {
  constexpr int kThreads = 4;
  constexpr int kRounds = 1500;
  std::mutex openMutex;
  std::set<uint32_t> openLowBits;
  std::atomic<uint32_t> latest{0};
  std::atomic<int> running{kThreads};
  std::vector<int> failures(kThreads + 1, 0);
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      for (int round = 0; round < kRounds; ++round) {
        uint32_t session = 0;
        const char *name = t % 2 == 0 ? "CAN1" : "FlexRay2";
        if (kvCreateSession("", "", "S", name, kvMode_SignalInSinglePoint, &session) != 0) {
          ++failures[t];
          continue;
        }
        latest = session;
        {
          std::lock_guard<std::mutex> lock(openMutex);
          if (!openLowBits.insert(session & 0xFFFFu).second) ++failures[t];
        }
        const uint32_t mine = static_cast<uint32_t>(t * 100000 + round);
        uint32_t read = 0;
        if (kvSetProperty(session, kvPropSession_QueueSize, 4, &mine) != 0 ||
            kvGetProperty(session, kvPropSession_QueueSize, 4, &read) != 0 || read != mine) {
          ++failures[t];
        }
        {
          // Out of the set before the clear: once cleared, the index may serve another thread.
          std::lock_guard<std::mutex> lock(openMutex);
          openLowBits.erase(session & 0xFFFFu);
        }
        if (kvClear(session) != 0) ++failures[t];
      }
      --running;
    });
  }
  threads.emplace_back([&] {
    double value = 0;
    uint32_t word = 0;
    // Bounded, so that the log keeps every creation for the count below.
    for (int i = 0; running > 0 && i < 20000; ++i) {
      const uint32_t session = latest;
      const int32_t read = kvReadSignalSinglePoint(session, &value, 8, nullptr, 0);
      const int32_t wait = kvWait(session, kvsimConditionIntfCommunicating, 0, &word, 0.0);
      if (read != 0 && read != kvsimErrInvalidSession) ++failures[kThreads];
      if (wait != kvsimErrTimeout && wait != kvsimErrInvalidSession &&
          wait != kvsimErrSessionCleared) {
        ++failures[kThreads];
      }
    }
  });
  for (std::thread &thread : threads) thread.join();
  for (int t = 0; t <= kThreads; ++t) EXPECT_EQ(failures[t], 0) << "thread " << t;
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), kThreads * kRounds);
}

}  // namespace
