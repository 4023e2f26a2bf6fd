// The managers' mutex: recursive, priority-inheriting, and a failure that lands in the owner's
// status block instead of an exception.
#include "core/recursive_mutex.h"

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <pthread.h>

#include <atomic>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace {

// The attribute calls of this program pass through these stand-ins, which record what was asked
// for and can refuse one call.
enum class eRefuse { kNothing, kType, kProtocol };
std::atomic<eRefuse> gRefuse{eRefuse::kNothing};
std::atomic<int> gTypeAsked{-1};
std::atomic<int> gProtocolAsked{-1};

template <typename F>
F Next(const char *name) {
  return reinterpret_cast<F>(dlsym(RTLD_NEXT, name));
}

}  // namespace

extern "C" int pthread_mutexattr_settype(pthread_mutexattr_t *attributes, int type) noexcept {
  gTypeAsked.store(type);
  if (gRefuse.load() == eRefuse::kType) return EINVAL;
  static const auto next = Next<int (*)(pthread_mutexattr_t *, int)>("pthread_mutexattr_settype");
  return next(attributes, type);
}

extern "C" int pthread_mutexattr_setprotocol(pthread_mutexattr_t *attributes,
                                             int protocol) noexcept {
  gProtocolAsked.store(protocol);
  if (gRefuse.load() == eRefuse::kProtocol) return ENOTSUP;
  static const auto next =
      Next<int (*)(pthread_mutexattr_t *, int)>("pthread_mutexattr_setprotocol");
  return next(attributes, protocol);
}

namespace {

using namespace nKVSVAPI100;

class RecursiveMutex : public testing::Test {
 protected:
  void SetUp() override {
    gRefuse.store(eRefuse::kNothing);
    gTypeAsked.store(-1);
    gProtocolAsked.store(-1);
  }
  void TearDown() override { gRefuse.store(eRefuse::kNothing); }
};

TEST_F(RecursiveMutex, IsMadeRecursiveAndPriorityInheriting) {
  tStatusBlock owner;
  cRecursiveMutex mutex(owner);
  EXPECT_TRUE(mutex.Valid());
  EXPECT_EQ(owner.code, 0);
  EXPECT_EQ(gTypeAsked.load(), PTHREAD_MUTEX_RECURSIVE);
  EXPECT_EQ(gProtocolAsked.load(), PTHREAD_PRIO_INHERIT);
}

TEST_F(RecursiveMutex, AFailedAttributeLeavesTheFailureInTheOwnersBlock) {
  for (eRefuse refuse : {eRefuse::kType, eRefuse::kProtocol}) {
    gRefuse.store(refuse);
    tStatusBlock owner;
    cRecursiveMutex mutex(owner);
    EXPECT_FALSE(mutex.Valid());
    EXPECT_EQ(owner.code, -52003);
    EXPECT_STREQ(owner.component, "kvsvapi");
    EXPECT_EQ(std::string(owner.file), "src/core/recursive_mutex.h");
    EXPECT_EQ(owner.line, 655u);
    // Callers test the block first; a mutex that was never made is never touched.
    std::lock_guard<cRecursiveMutex> lock(mutex);
  }
}

TEST_F(RecursiveMutex, AFailureDoesNotDisplaceAnEarlierError) {
  gRefuse.store(eRefuse::kProtocol);
  tStatusBlock owner;
  SetStatusBlock(owner, -7, "earlier", "earlier.cpp", 3);
  cRecursiveMutex mutex(owner);
  EXPECT_EQ(owner.code, -7);
  EXPECT_EQ(owner.line, 3u);
}

TEST_F(RecursiveMutex, LocksAgainInItsOwnerAndKeepsOtherThreadsOut) {
  constexpr int kThreads = 4;
  constexpr int kRounds = 20000;
  tStatusBlock owner;
  cRecursiveMutex mutex(owner);
  // Plain, unsynchronised counters: only the mutex keeps the increments whole.
  long total = 0;
  long nested = 0;
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&] {
      for (int i = 0; i < kRounds; ++i) {
        std::lock_guard<cRecursiveMutex> outer(mutex);
        ++total;
        std::lock_guard<cRecursiveMutex> inner(mutex);
        ++nested;
      }
    });
  }
  for (auto &thread : threads) thread.join();
  EXPECT_EQ(total, long{kThreads} * kRounds);
  EXPECT_EQ(nested, long{kThreads} * kRounds);
}

}  // namespace
