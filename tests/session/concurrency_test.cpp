// Sessions and system objects used from several threads at once: a session that ends under a
// call blocked in the driver, sessions created, read, cleared, closed and aborted together, system
// objects opened and closed in parallel, and waits that the end of a program aborts.
#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <cmath>
#include <future>
#include <limits>
#include <mutex>
#include <random>
#include <set>
#include <string>
#include <thread>
#include <vector>

#include "session/object_class.h"
#include "session/session_fixture.h"
#include "session/system_manager.h"
#include "support/session_helpers.h"

namespace {

using namespace nKVSVAPI100;

using Concurrency = SessionFixture;

TEST_F(Concurrency, ABlockedReadReturnsBeforeTheSlotIsFreed) {
  // The program closes the session, or the host's clean-up thread aborts it as the program stops.
  for (const bool byAbort : {false, true}) {
    SCOPED_TRACE(byAbort ? "abort" : "close");
    const auto made = kvsvtest::CreateManual("A,B", kvMode_SignalInSinglePoint, "CAN1");
    ASSERT_EQ(made.status, 0);
    kvsvStatus status = 0;
    SvHandle values = nullptr;
    ASSERT_EQ(kvsimHold("kvReadSignalSinglePoint"), 0);
    std::thread reader([&] { status = kvsvReadSignalSinglePoint(made.handle, &values); });
    ASSERT_EQ(kvsimWaitParked("kvReadSignalSinglePoint", 1), 1);
    EXPECT_EQ(Slot(made.handle)->guard.load(), 1u);
    if (byAbort) {
      // What a blocking call registers before it enters the driver.
      ASSERT_EQ(svSetCleanupProc(kvsvSessionAbort, made.handle, 6), 0);
      SvsimEndReport report{};
      ASSERT_EQ(svsimEndProgram(&report), 0);
      EXPECT_EQ(report.cleanupsRun, 1);
    } else {
      EXPECT_EQ(kvsvSessionClose(made.handle), 0);
    }
    reader.join();
    EXPECT_EQ(status, kvsimErrSessionCleared);
    EXPECT_EQ(Slot(made.handle), nullptr);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_EQ(kvsvReadSignalSinglePoint(made.handle, &values), kvErrInvalidSession);
    kvsimRelease("kvReadSignalSinglePoint");
    Keep(values);
    svsimEndProgram(nullptr);
  }
}

TEST_F(Concurrency, AbortOfAnErrorHandleFreesItsGuardAndItsErrorChild) {
  uint32_t device = 0;
  ASSERT_EQ(OpenDevice("NoSuchDevice", &device), 0);
  ASSERT_EQ(ClassFromHandle(static_cast<int32_t>(device)), kClassSession);
  ASSERT_EQ(PlaceSlot(device), 0);
  Slot(device)->guard = 1;  // a call in progress on the error handle
  EXPECT_EQ(kvsvSessionAbort(device), 0);
  ASSERT_NE(Slot(device), nullptr);
  EXPECT_EQ(Slot(device)->guard.load(), 0u);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_FALSE(RemoveErrorChild(device)) << "the abort took the error child away";
}

TEST_F(Concurrency, CreateReadClearCloseAndAbortAtOnce) {
  constexpr int kOwners = 2, kRounds = 60;
  // Reads meet sessions in every phase of their life.
  const std::set<kvsvStatus> readStatuses = {0, kvErrInvalidSession, kvErrSessionBusy,
                                             kvsimErrInvalidSession, kvsimErrSessionCleared};
  std::array<std::atomic<uint32_t>, 8> pool{};
  std::atomic<int> ownersLeft{kOwners};
  std::mutex mutex;
  std::vector<std::string> unexpected;
  auto check = [&](const char *what, kvsvStatus status, const std::set<kvsvStatus> &allowed) {
    if (allowed.count(status) != 0) return;
    std::lock_guard<std::mutex> lock(mutex);
    unexpected.push_back(std::string(what) + " " + std::to_string(status));
  };
  auto owner = [&](int id) {
    SvHandle values = nullptr;
    for (int round = 0; round < kRounds; ++round) {
      const auto made = kvsvtest::CreateManual("A,B", kvMode_SignalInSinglePoint,
                                               id % 2 == 0 ? "CAN1" : "CAN3");
      check("create", made.status, {0});
      pool[static_cast<size_t>(round + id) % pool.size()] = made.handle;
      for (int i = 0; i < 5; ++i)
        check("owner read", kvsvReadSignalSinglePoint(made.handle, &values), readStatuses);
      if (round % 2 == 0)
        check("clear", kvsvSessionClear(made.handle, made.reference), {0});
      else
        check("close", kvsvSessionClose(made.handle), {0});
    }
    svDisposeHandle(values);
    --ownersLeft;
  };
  auto reader = [&] {
    std::mt19937 random(7);
    SvHandle values = nullptr;
    while (ownersLeft.load() > 0)
      check("reader read", kvsvReadSignalSinglePoint(pool[random() % pool.size()], &values),
            readStatuses);
    svDisposeHandle(values);
  };
  auto aborter = [&] {
    std::mt19937 random(11);
    while (ownersLeft.load() > 0) {
      check("abort", kvsvSessionAbort(pool[random() % pool.size()]), {0});
      std::this_thread::yield();
    }
  };
  std::vector<std::thread> threads;
  for (int id = 0; id < kOwners; ++id) threads.emplace_back(owner, id);
  threads.emplace_back(reader);
  threads.emplace_back(aborter);
  for (std::thread &t : threads) t.join();
  EXPECT_TRUE(unexpected.empty()) << unexpected.size() << " unexpected, first: "
                                  << unexpected.front();
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  for (const auto &entry : pool) EXPECT_FALSE(kvsvtest::HasSlot(entry.load()));
}

constexpr int kThreads = 6, kRounds = 150;

// Runs `body(thread, round)` on every thread while another thread reads the count without the
// lock, as host programs do; the number of rounds in which `body` saw something wrong.
template <typename Body>
int RunThreads(Body body) {
  std::atomic<int> failures{0};
  std::atomic<bool> done{false};
  std::thread reader([&] {
    while (!done.load()) static_cast<void>(kvsvGetSystemRefCount());
  });
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t)
    threads.emplace_back([&, t] {
      for (int round = 0; round < kRounds; ++round)
        if (!body(t, round)) failures.fetch_add(1);
    });
  for (std::thread &thread : threads) thread.join();
  done.store(true);
  reader.join();
  return failures.load();
}

TEST_F(Concurrency, ParallelOpensAndClosesOfSystemObjectsComeOutEven) {
  // Each thread has an interface of its own, so that its host reference is only ever removed by
  // its own close (two names of one interface would share a handle); the devices are shared.
  const char *const interfaceOf[kThreads] = {"CAN1", "can2", "LIN1", "FlexRay2", "enet1/monitor",
                                             "CAN4"};
  std::vector<SvHandle> interfaces, devices;
  for (int t = 0; t < kThreads; ++t) {
    interfaces.push_back(*Name(interfaceOf[t]));
    devices.push_back(*Name(t % 2 == 0 ? kBusBoxCanLin : kBusBoxFlexRayEnet));
  }
  // The count often falls to 0 between rounds, so the system is closed and opened again while
  // other threads acquire it.
  const int failures = RunThreads([&](int t, int) {
    SvHandle intfName = interfaces[t], deviceName = devices[t];
    uint32_t system = 0, device = 0, intf = 0;
    bool ok = kvsvSystemOpen(nullptr, &system) == 0 && kvsvDeviceOpen(&deviceName, &device) == 0 &&
              kvsvInterfaceOpen(&intfName, &intf) == 0;
    ok = ok && (system >> 24) == 0x01u && (device & 0xFFFF0000u) == system &&
         (intf & 0xFFFF0000u) == system && (intf & 0xFu) != 0;
    const SvRefnum reference = HostRef(interfaceOf[t], intf, false);
    // Closes in another order than the opens, one through the close of another class.
    ok = ok && kvsvInterfaceClose(intf) == 0 && kvsvSystemClose(device) == 0 &&
         kvsvSystemClose(system) == 0;
    return ok && !HostHasRef(reference);
  });
  EXPECT_EQ(failures, 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), kvsimCountCalls("kvSystemClose"));
  EXPECT_EQ(svsimRefCount(), 0);
}

TEST_F(Concurrency, ErrorChildrenKeepTheirAcquiresUnderContention) {
  std::vector<SvHandle> missing;
  for (int t = 0; t < kThreads; ++t) missing.push_back(*Name(("nowhere" + std::to_string(t)).c_str()));
  const int failures = RunThreads([&](int t, int round) {
    SvHandle name = missing[t];
    uint32_t system = 0, handle = 0;
    bool ok = kvsvSystemOpen(nullptr, &system) == 0 && kvsvInterfaceOpen(&name, &handle) == 0 &&
              IsErrorHandle(handle);
    // The error handle ends through a close of another class, or the session close.
    ok = ok && (round % 2 == 0 ? kvsvDeviceClose(handle) : kvsvSessionClose(handle)) == 0;
    return ok && kvsvSystemClose(system) == 0;
  });
  EXPECT_EQ(failures, 0);
  // Only the acquires of the error children are still out.
  EXPECT_EQ(kvsvGetSystemRefCount(), static_cast<uint32_t>(kThreads * kRounds));
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvsimOpenSessionCount(), 0) << "every error session was cleared";
  // Parallel releases of the rest close the driver's system exactly once.
  EXPECT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  std::vector<uint32_t> handles(64);
  for (uint32_t &handle : handles) ASSERT_EQ(kvsvSystemOpen(nullptr, &handle), 0);
  kvsimLogClear();
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t)
    threads.emplace_back([&, t] {
      for (size_t i = t; i < handles.size(); i += kThreads) kvsvSystemClose(handles[i]);
    });
  for (std::thread &thread : threads) thread.join();
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
}

class SessionWait : public SessionFixture {
 protected:
  void SetUp() override {
    SessionFixture::SetUp();
    ASSERT_EQ(kvCreateSession("DB", "Cluster", "", "CAN3", kvMode_FrameInStream, &session_), 0);
  }
  std::future<int32_t> WaitAsync(double timeLimit) {
    return std::async(std::launch::async, [session = session_, timeLimit] {
      uint32_t value = 0;
      return kvsvSessionWait(session, kvsimConditionIntfCommunicating, 0, &value, timeLimit);
    });
  }
  void ExpectAbortRegistered() const {
    SvCleanupProc procedure = nullptr;
    uint64_t argument = 0;
    int32_t mode = 0;
    ASSERT_EQ(svsimLastCleanup(&procedure, &argument, &mode), 1);
    EXPECT_EQ(procedure, &kvsvSessionAbort);
    EXPECT_EQ(argument, session_);
    EXPECT_EQ(mode, 6);
  }
  uint32_t session_ = 0;
};

TEST_F(SessionWait, EveryTimeLimitButZeroRegistersTheAbortForGood) {
  ASSERT_EQ(kvsimRaiseCondition(session_, kvsimConditionIntfRemoteWakeup, 4242), 0);
  const double inf = std::numeric_limits<double>::infinity();
  const struct {
    double timeLimit;
    bool registers;
    int32_t status;  // the driver refuses a NaN limit, after the registration
  } cases[] = {
      {1.0, true, 0},  {-1.0, true, 0},  {std::nan(""), true, kvsimErrInvalidArgument},
      {inf, true, 0},  {-inf, true, 0},  {1e-300, true, 0},
      {0.0, false, 0}, {-0.0, false, 0},
  };
  int32_t registrations = 0;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.timeLimit);
    kvsimLogClear();
    uint32_t value = 0;
    EXPECT_EQ(kvsvSessionWait(session_, kvsimConditionIntfRemoteWakeup, 0x00C0FFEEu, &value,
                              c.timeLimit),
              c.status);
    registrations += c.registers ? 1 : 0;
    EXPECT_EQ(svsimCleanupRegistrations(), registrations);
    EXPECT_EQ(svsimPendingCleanups(), registrations) << "no registration is taken back";
    if (c.registers) ExpectAbortRegistered();
    kvsimCallRecord record;
    ASSERT_EQ(kvsimLogEntry(0, &record), 1);
    EXPECT_STREQ(record.function, "kvWait");
    EXPECT_EQ(record.object, session_);
    EXPECT_EQ(record.propertyId, static_cast<uint32_t>(kvsimConditionIntfRemoteWakeup));
    EXPECT_EQ(record.size1, 0x00C0FFEEu);
    EXPECT_EQ(value, c.status == 0 ? 4242u : 0u);
  }
}

TEST_F(SessionWait, TheAbortIsRegisteredBeforeTheDriverIsCalled) {
  ASSERT_EQ(kvsimHold("kvWait"), 0);
  auto waiting = WaitAsync(2.5);
  ASSERT_EQ(kvsimWaitParked("kvWait", 1), 1);
  EXPECT_EQ(svsimCleanupRegistrations(), 1);
  ExpectAbortRegistered();
  ASSERT_EQ(kvsimRaiseCondition(session_, kvsimConditionIntfCommunicating, 0), 0);
  ASSERT_EQ(kvsimRelease("kvWait"), 0);
  EXPECT_EQ(waiting.get(), 0);
}

TEST_F(SessionWait, StoppingTheProgramAbortsTheSessionOfABlockedWait) {
  auto waiting = WaitAsync(-1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvWait", 1), 1);
  ASSERT_EQ(svsimEndProgramAsync(), 0);
  SvsimEndReport report{};
  ASSERT_EQ(svsimJoinEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 1);
  EXPECT_EQ(waiting.get(), kvsimErrSessionCleared);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

}  // namespace
