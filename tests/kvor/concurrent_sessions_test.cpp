// Many threads creating, using and clearing sessions at once: handles stay unique among open
// sessions and every session keeps its own values.
#include <mutex>
#include <set>
#include <thread>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorConcurrentSessions = KvorTest;

TEST_F(KvorConcurrentSessions, ThreadsCreatingAndClearingNeverShareLowBits) {
  constexpr int kThreads = 4;
  constexpr int kRounds = 1500;
  std::mutex openMutex;
  std::set<uint32_t> openLowBits;
  std::vector<std::thread> threads;
  std::vector<int> failures(kThreads, 0);
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      for (int round = 0; round < kRounds; ++round) {
        uint32_t session = 0;
        const char *name = t % 2 == 0 ? "CAN1" : "FlexRay2";
        if (kvCreateSession("", "", "S", name, kvMode_SignalInSinglePoint, &session) != 0) {
          ++failures[t];
          continue;
        }
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
    });
  }
  for (std::thread &thread : threads) thread.join();
  for (int t = 0; t < kThreads; ++t) EXPECT_EQ(failures[t], 0) << "thread " << t;
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), kThreads * kRounds);
}

TEST_F(KvorConcurrentSessions, ClearRacingWithUseLeavesEachCallAValidAnswer) {
  constexpr int kRounds = 300;
  for (int round = 0; round < kRounds; ++round) {
    const uint32_t session = Create("CAN3", kvMode_SignalInSinglePoint, "A");
    std::thread user([session] {
      double value = 0;
      uint32_t word = 0;
      for (int i = 0; i < 20; ++i) {
        const int32_t read = kvReadSignalSinglePoint(session, &value, 8, nullptr, 0);
        const int32_t wait = kvWait(session, kvsimConditionIntfCommunicating, 0, &word, 0.0);
        EXPECT_TRUE(read == 0 || read == kvsimErrInvalidSession) << read;
        EXPECT_TRUE(wait == kvsimErrTimeout || wait == kvsimErrInvalidSession ||
                    wait == kvsimErrSessionCleared)
            << wait;
      }
    });
    EXPECT_EQ(kvClear(session), 0);
    user.join();
  }
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

}  // namespace
