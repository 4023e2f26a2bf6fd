// The end of a program: clean-up procedures, then the close exports of the references still
// registered, on a thread of the host's own, also while another thread is blocked.
#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "host_fixture.h"
#include "reference_args.h"

namespace {

// What the procedures and the close export saw, in the order they ran.
struct Journal {
  std::mutex mutex;
  std::vector<std::string> events;
  std::vector<std::thread::id> threads;
  std::vector<int32_t> refCountsAtClose;

  void Add(const std::string &event) {
    std::lock_guard<std::mutex> lock(mutex);
    events.push_back(event);
    threads.push_back(std::this_thread::get_id());
  }
  void Clear() {
    std::lock_guard<std::mutex> lock(mutex);
    events.clear();
    threads.clear();
    refCountsAtClose.clear();
  }
};

Journal gJournal;

int32_t RecordCleanup(uint64_t argument) {
  gJournal.Add("cleanup " + std::to_string(argument));
  return 0;
}

}  // namespace

// The close export that the references of these tests name: found by the host in the program.
extern "C" int32_t svhostTestClose(uint32_t handle) {
  // A close may use the host; it must not find itself still registered.
  SvHandle scratch = svNewHandleClr(16);
  svDisposeHandle(scratch);
  const int32_t refs = svsimRefCount();
  gJournal.Add("close " + std::to_string(handle));
  std::lock_guard<std::mutex> lock(gJournal.mutex);
  gJournal.refCountsAtClose.push_back(refs);
  return 0;
}

namespace {

// A driver call that blocks until a clean-up procedure aborts it, or gives up after a long limit
// so that a host that never runs the procedure fails the test instead of hanging it.
struct BlockedCall {
  std::mutex mutex;
  std::condition_variable changed;
  bool blocked = false;
  bool aborted = false;
  std::thread::id abortThread;
};

BlockedCall gCall;

struct Gate {
  std::mutex mutex;
  std::condition_variable changed;
  bool entered = false;
  bool open = false;
};

Gate gGate;

class EndProgram : public HostTest {
 protected:
  void SetUp() override {
    HostTest::SetUp();
    gJournal.Clear();
    std::lock_guard<std::mutex> callLock(gCall.mutex);
    gCall.blocked = gCall.aborted = false;
    gCall.abortThread = std::thread::id();
    std::lock_guard<std::mutex> gateLock(gGate.mutex);
    gGate.entered = gGate.open = false;
  }
};

void RegisterWithClose(const char *name, uint32_t handle, const char *closeName) {
  ReferenceArgs args;
  args.name = name;
  args.handle = handle;
  args.closeName = closeName;
  SvRefnum cookie = 0;
  ASSERT_EQ(Register(args, &cookie), 0);
}

TEST_F(EndProgram, CleanupsThenClosesRunOnAnotherThread) {
  ASSERT_EQ(svSetCleanupProc(RecordCleanup, 1, 6), 0);
  ASSERT_EQ(svSetCleanupProc(RecordCleanup, 2, 6), 0);
  RegisterWithClose("first", 11, "svhostTestClose");
  RegisterWithClose("missing", 12, "kvsvNoSuchCloseExport");
  RegisterWithClose("third", 13, "svhostTestClose");

  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 2);
  EXPECT_EQ(report.closesCalled, 2);
  EXPECT_EQ(report.closesMissing, 1);
  EXPECT_EQ(gJournal.events,
            (std::vector<std::string>{"cleanup 1", "cleanup 2", "close 11", "close 13"}));
  ASSERT_EQ(gJournal.threads.size(), 4u);
  for (const std::thread::id &id : gJournal.threads) {
    EXPECT_NE(id, std::this_thread::get_id());
    EXPECT_EQ(id, gJournal.threads[0]) << "one end, one thread";
  }
  EXPECT_EQ(gJournal.refCountsAtClose, (std::vector<int32_t>{0, 0}));
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(svsimPendingCleanups(), 0);
  EXPECT_EQ(svsimCleanupRegistrations(), 2) << "registrations are history, not pending work";

  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 0) << "each procedure runs once";
  EXPECT_EQ(report.closesCalled, 0);
}

int32_t AbortBlockedCall(uint64_t) {
  std::lock_guard<std::mutex> lock(gCall.mutex);
  gCall.aborted = true;
  gCall.abortThread = std::this_thread::get_id();
  gCall.changed.notify_all();
  return 0;
}

TEST_F(EndProgram, AnAsyncEndAbortsACallBlockedOnAnotherThread) {
  bool released = false;
  std::thread::id callThread;
  std::thread program([&] {
    callThread = std::this_thread::get_id();
    EXPECT_EQ(svSetCleanupProc(AbortBlockedCall, 0x00010002, 6), 0);
    std::unique_lock<std::mutex> lock(gCall.mutex);
    gCall.blocked = true;
    gCall.changed.notify_all();
    released = gCall.changed.wait_for(lock, std::chrono::seconds(60), [] { return gCall.aborted; });
  });
  {
    std::unique_lock<std::mutex> lock(gCall.mutex);
    gCall.changed.wait(lock, [] { return gCall.blocked; });
  }
  ASSERT_EQ(svsimEndProgramAsync(), 0);
  program.join();
  SvsimEndReport report{};
  ASSERT_EQ(svsimJoinEndProgram(&report), 0);
  EXPECT_TRUE(released);
  EXPECT_EQ(report.cleanupsRun, 1);
  EXPECT_NE(gCall.abortThread, std::this_thread::get_id());
  EXPECT_NE(gCall.abortThread, callThread);
}

int32_t RegisterAnother(uint64_t argument) {
  svSetCleanupProc(RecordCleanup, argument + 1, 6);
  return 0;
}

TEST_F(EndProgram, WhatIsRegisteredDuringTheEndBelongsToTheNextProgram) {
  ASSERT_EQ(svSetCleanupProc(RegisterAnother, 40, 6), 0);
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 1);
  EXPECT_EQ(svsimPendingCleanups(), 1);
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 1);
  EXPECT_EQ(gJournal.events, (std::vector<std::string>{"cleanup 41"}));
}

int32_t WaitAtGate(uint64_t) {
  std::unique_lock<std::mutex> lock(gGate.mutex);
  gGate.entered = true;
  gGate.changed.notify_all();
  gGate.changed.wait(lock, [] { return gGate.open; });
  return 0;
}

TEST_F(EndProgram, OneEndAtATime) {
  EXPECT_EQ(svsimJoinEndProgram(nullptr), -1) << "nothing started";
  ASSERT_EQ(svSetCleanupProc(WaitAtGate, 0, 6), 0);
  ASSERT_EQ(svsimEndProgramAsync(), 0);
  {
    std::unique_lock<std::mutex> lock(gGate.mutex);
    gGate.changed.wait(lock, [] { return gGate.entered; });
  }
  EXPECT_EQ(svsimEndProgramAsync(), -1);
  EXPECT_EQ(svsimEndProgram(nullptr), -1);
  {
    std::lock_guard<std::mutex> lock(gGate.mutex);
    gGate.open = true;
    gGate.changed.notify_all();
  }
  SvsimEndReport report{};
  ASSERT_EQ(svsimJoinEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 1);
  EXPECT_EQ(svsimJoinEndProgram(nullptr), -1) << "joined already";
}

}  // namespace
