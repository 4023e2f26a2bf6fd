// Clean-up procedures and the end of a program: the procedures, then the close exports of the
// references still registered, on a thread of the host's own.
#include <gtest/gtest.h>

#include <condition_variable>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "host_fixture.h"

namespace {

// What the procedures and the close export saw, in the order they ran, and on which threads.
struct Journal {
  std::mutex mutex;
  std::vector<std::string> events;
  std::vector<std::thread::id> threads;

  void Add(const std::string &event) {
    std::lock_guard<std::mutex> lock(mutex);
    events.push_back(event);
    threads.push_back(std::this_thread::get_id());
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
  gJournal.Add("close " + std::to_string(handle) + ", references " +
               std::to_string(svsimRefCount()));
  return 0;
}

namespace {

class EndProgram : public HostTest {
 protected:
  void SetUp() override {
    HostTest::SetUp();
    std::lock_guard<std::mutex> lock(gJournal.mutex);
    gJournal.events.clear();
    gJournal.threads.clear();
  }
};

TEST_F(EndProgram, CleanupsThenClosesRunOnceOnAnotherThread) {
  EXPECT_EQ(svSetCleanupProc(nullptr, 1, 6), SVSIM_ERR_ARGUMENT);
  ASSERT_EQ(svSetCleanupProc(RecordCleanup, 1, 6), 0);
  ASSERT_EQ(svSetCleanupProc(RecordCleanup, 0xFFFFFFFF00000002ull, 3), 0);
  EXPECT_EQ(svsimPendingCleanups(), 2);
  SvCleanupProc procedure = nullptr;
  uint64_t argument = 0;
  int32_t mode = 0;
  ASSERT_EQ(svsimLastCleanup(&procedure, &argument, &mode), 1);
  EXPECT_EQ(procedure, &RecordCleanup);
  EXPECT_EQ(argument, 0xFFFFFFFF00000002ull);
  EXPECT_EQ(mode, 3);
  const struct {
    const char *name;
    uint32_t handle;
    const char *closeName;
  } references[] = {{"first", 11, "svhostTestClose"},
                    {"missing", 12, "kvsvNoSuchCloseExport"},
                    {"third", 13, "svhostTestClose"}};
  for (const auto &r : references) {
    ReferenceArgs args;
    args.name = r.name;
    args.handle = r.handle;
    args.closeName = r.closeName;
    SvRefnum cookie = 0;
    ASSERT_EQ(Register(args, &cookie), 0);
  }

  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 2);
  EXPECT_EQ(report.closesCalled, 2);
  EXPECT_EQ(report.closesMissing, 1);
  EXPECT_EQ(gJournal.events,
            (std::vector<std::string>{"cleanup 1", "cleanup 18446744069414584322",
                                      "close 11, references 0", "close 13, references 0"}));
  ASSERT_EQ(gJournal.threads.size(), 4u);
  for (const std::thread::id &id : gJournal.threads) {
    EXPECT_NE(id, std::this_thread::get_id());
    EXPECT_EQ(id, gJournal.threads[0]) << "one end, one thread";
  }
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(svsimPendingCleanups(), 0);
  EXPECT_EQ(svsimCleanupRegistrations(), 2) << "registrations are history, not pending work";

  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun + report.closesCalled, 0) << "each runs once";
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

// A procedure that stays inside the end until the test opens the gate.
struct Gate {
  std::mutex mutex;
  std::condition_variable changed;
  bool entered = false;
  bool open = false;
};

Gate gGate;

int32_t WaitAtGate(uint64_t) {
  std::unique_lock<std::mutex> lock(gGate.mutex);
  gGate.entered = true;
  gGate.changed.notify_all();
  gGate.changed.wait(lock, [] { return gGate.open; });
  return 0;
}

TEST_F(EndProgram, OneEndAtATimeAndTheAsyncStartReturnsAtOnce) {
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
