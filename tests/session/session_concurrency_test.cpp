// Sessions created, read, cleared, closed and aborted from several threads at once: every call
// gets a status it may give, nothing crashes, nothing is left behind.
#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <mutex>
#include <random>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "support/session_helpers.h"
#include "svsim.h"

namespace {

class SessionConcurrency : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
  }
  void TearDown() override {
    svsimEndProgram(nullptr);
    kvsimReset();
    svsimReset();
  }

  void Check(const char *what, kvsvStatus status, const std::set<kvsvStatus> &allowed) {
    if (allowed.count(status) != 0) return;
    std::lock_guard<std::mutex> lock(mutex_);
    unexpected_.push_back(std::string(what) + " " + std::to_string(status));
  }

  std::mutex mutex_;
  std::vector<std::string> unexpected_;
};

TEST_F(SessionConcurrency, CreateReadClearCloseAndAbortAtOnce) {
  constexpr int kOwners = 2;
  constexpr int kRounds = 60;
  // Reads meet sessions in every phase of their life.
  const std::set<kvsvStatus> readStatuses = {0, kvErrInvalidSession, kvErrSessionBusy,
                                             kvsimErrInvalidSession, kvsimErrSessionCleared};
  std::array<std::atomic<uint32_t>, 8> pool{};
  std::atomic<int> ownersLeft{kOwners};

  auto owner = [&](int id) {
    SvHandle values = nullptr;
    for (int round = 0; round < kRounds; ++round) {
      const auto made = kvsvtest::CreateManual("A,B", kvMode_SignalInSinglePoint,
                                               id % 2 == 0 ? "CAN1" : "CAN3");
      Check("create", made.status, {0});
      pool[static_cast<size_t>(round + id) % pool.size()] = made.handle;
      for (int i = 0; i < 5; ++i)
        Check("owner read", kvsvReadSignalSinglePoint(made.handle, &values), readStatuses);
      if (round % 2 == 0)
        Check("clear", kvsvSessionClear(made.handle, made.reference), {0});
      else
        Check("close", kvsvSessionClose(made.handle), {0});
    }
    svDisposeHandle(values);
    --ownersLeft;
  };
  auto reader = [&] {
    std::mt19937 random(7);
    SvHandle values = nullptr;
    while (ownersLeft.load() > 0) {
      const uint32_t handle = pool[random() % pool.size()].load();
      Check("reader read", kvsvReadSignalSinglePoint(handle, &values), readStatuses);
    }
    svDisposeHandle(values);
  };
  auto aborter = [&] {
    std::mt19937 random(11);
    while (ownersLeft.load() > 0) {
      const uint32_t handle = pool[random() % pool.size()].load();
      Check("abort", kvsvSessionAbort(handle), {0});
      std::this_thread::yield();
    }
  };

  std::vector<std::thread> threads;
  for (int id = 0; id < kOwners; ++id) threads.emplace_back(owner, id);
  threads.emplace_back(reader);
  threads.emplace_back(aborter);
  for (std::thread &t : threads) t.join();

  EXPECT_TRUE(unexpected_.empty()) << unexpected_.size() << " unexpected, first: "
                                   << unexpected_.front();
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  for (const auto &entry : pool) EXPECT_FALSE(kvsvtest::HasSlot(entry.load()));
}

}  // namespace
