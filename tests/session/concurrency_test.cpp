// Sessions and system objects used from several threads at once: a session that ends under a
// call blocked in the driver, sessions created, read, cleared, closed and aborted together, system
// objects opened and closed in parallel, and waits whose abort is registered before they block.
#include <gtest/gtest.h>

#include <array>
#include <atomic>
#include <cmath>
#include <future>
#include <limits>
#include <random>
#include <set>
#include <thread>
#include <tuple>

#include "session/system_manager.h"
#include "support/session_fixture.h"

namespace {

using namespace nKVSVAPI100;

using Concurrency = SessionFixture;

TEST_F(Concurrency, ABlockedReadReturnsBeforeTheSlotIsFreed) {
  // The program closes the session, or the host's clean-up thread aborts it as the program stops.
  for (const bool byAbort : {false, true}) {
    SCOPED_TRACE(byAbort ? "abort" : "close");
    const auto made = kvsvtest::CreateManual("A,B", kvMode_SignalInSinglePoint, "CAN1");
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
    kvsimRelease("kvReadSignalSinglePoint");
    Keep(values);
    svsimEndProgram(nullptr);
  }
}

TEST_F(Concurrency, AbortOfAnErrorHandleFreesItsGuardAndItsErrorChild) {
  uint32_t device = 0;
  ASSERT_EQ(OpenDevice("NoSuchDevice", &device), 0);
  ASSERT_EQ(PlaceSlot(device), 0);
  Slot(device)->guard = 1;  // a call in progress on the error handle
  EXPECT_EQ(kvsvSessionAbort(device), 0);
  EXPECT_EQ(Slot(device)->guard.load(), 0u);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_FALSE(RemoveErrorChild(device)) << "the abort took the error child away";
}

TEST_F(Concurrency, CreateReadClearCloseAndAbortAtOnce) {
  // Reads meet sessions in every phase of their life; nothing else may fail.
  const std::set<kvsvStatus> reads = {0, kvErrInvalidSession, kvErrSessionBusy,
                                      kvsimErrInvalidSession, kvsimErrSessionCleared};
  std::array<std::atomic<uint32_t>, 8> pool{};
  std::atomic<int> ownersLeft{2}, unexpected{0};
  auto read = [&](uint32_t handle, SvHandle &values) {
    if (reads.count(kvsvReadSignalSinglePoint(handle, &values)) == 0) ++unexpected;
  };
  auto owner = [&](int id) {
    SvHandle values = nullptr;
    for (int round = 0; round < 60; ++round) {
      const auto made =
          kvsvtest::CreateManual("A,B", kvMode_SignalInSinglePoint, id == 0 ? "CAN1" : "CAN3");
      pool[static_cast<size_t>(round + id) % pool.size()] = made.handle;
      for (int i = 0; i < 5; ++i) read(made.handle, values);
      const kvsvStatus ended = round % 2 == 0 ? kvsvSessionClear(made.handle, made.reference)
                                              : kvsvSessionClose(made.handle);
      if (made.status != 0 || ended != 0) ++unexpected;
    }
    svDisposeHandle(values);
    --ownersLeft;
  };
  std::vector<std::thread> threads;
  for (int id = 0; id < 2; ++id) threads.emplace_back(owner, id);
  threads.emplace_back([&] {
    SvHandle values = nullptr;
    for (std::mt19937 random(7); ownersLeft.load() > 0;) read(pool[random() % pool.size()], values);
    svDisposeHandle(values);
  });
  threads.emplace_back([&] {
    for (std::mt19937 random(11); ownersLeft.load() > 0; std::this_thread::yield())
      if (kvsvSessionAbort(pool[random() % pool.size()]) != 0) ++unexpected;
  });
  for (std::thread &t : threads) t.join();
  EXPECT_EQ(unexpected.load(), 0);
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
  const char *const interfaceOf[kThreads] = {"CAN1",     "can2",          "LIN1",
                                             "FlexRay2", "enet1/monitor", "CAN4"};
  // The count often falls to 0 between rounds, so the system is closed and opened again while
  // other threads acquire it.
  const int failures = RunThreads([&](int t, int) {
    SvHandle intfName = svsimMakeString(interfaceOf[t]);
    SvHandle deviceName = svsimMakeString(t % 2 == 0 ? kBusBoxCanLin : kBusBoxFlexRayEnet);
    uint32_t system = 0, device = 0, intf = 0;
    bool ok = kvsvSystemOpen(nullptr, &system) == 0 && kvsvDeviceOpen(&deviceName, &device) == 0 &&
              kvsvInterfaceOpen(&intfName, &intf) == 0;
    ok = ok && (device & 0xFFFF0000u) == system && (intf & 0xFFFF0000u) == system;
    const SvRefnum reference = HostRef(interfaceOf[t], intf, false);
    // Closes in another order than the opens, one through the close of another class.
    ok = ok && kvsvInterfaceClose(intf) == 0 && kvsvSystemClose(device) == 0 &&
         kvsvSystemClose(system) == 0;
    svDisposeHandle(intfName);
    svDisposeHandle(deviceName);
    return ok && !HostHasRef(reference);
  });
  EXPECT_EQ(failures, 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), kvsimCountCalls("kvSystemClose"));
}

TEST_F(Concurrency, ErrorChildrenKeepTheirAcquiresUnderContention) {
  const int failures = RunThreads([&](int t, int round) {
    SvHandle name = svsimMakeString(("nowhere" + std::to_string(t)).c_str());
    uint32_t system = 0, handle = 0;
    bool ok = kvsvSystemOpen(nullptr, &system) == 0 && kvsvInterfaceOpen(&name, &handle) == 0 &&
              IsErrorHandle(handle);
    svDisposeHandle(name);
    // The error handle ends through a close of another class, or the session close.
    ok = ok && (round % 2 == 0 ? kvsvDeviceClose(handle) : kvsvSessionClose(handle)) == 0;
    return ok && kvsvSystemClose(system) == 0;
  });
  EXPECT_EQ(failures, 0);
  // Only the acquires of the error children are still out.
  EXPECT_EQ(kvsvGetSystemRefCount(), static_cast<uint32_t>(kThreads * kRounds));
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvsimOpenSessionCount(), 0) << "every error session was cleared";
}

using SessionWait = SessionFixture;

TEST_F(SessionWait, EveryTimeLimitButZeroRegistersTheAbortBeforeTheDriverWaits) {
  uint32_t s = 0;
  ASSERT_EQ(kvCreateSession("DB", "Cluster", "", "CAN3", kvMode_FrameInStream, &s), 0);
  ASSERT_EQ(kvsimRaiseCondition(s, kvsimConditionIntfRemoteWakeup, 4242), 0);
  // The driver refuses a NaN limit, after the registration.
  const double inf = std::numeric_limits<double>::infinity();
  const std::tuple<double, bool, int32_t> cases[] = {
      {1.0, true, 0},    {-inf, true, 0}, {std::nan(""), true, kvsimErrInvalidArgument},
      {1e-300, true, 0}, {0.0, false, 0}, {-0.0, false, 0}};
  int32_t registrations = 0;
  for (const auto &[timeLimit, registers, status] : cases) {
    SCOPED_TRACE(timeLimit);
    kvsimLogClear();
    uint32_t value = 0;
    EXPECT_EQ(kvsvSessionWait(s, kvsimConditionIntfRemoteWakeup, 0xC0FFEE, &value, timeLimit),
              status);
    EXPECT_EQ(value, status == 0 ? 4242u : 0u);
    registrations += registers ? 1 : 0;
    EXPECT_EQ(svsimCleanupRegistrations(), registrations);
    EXPECT_EQ(svsimPendingCleanups(), registrations == 0 ? 0 : 1) << "one abort per session";
    kvsimCallRecord record;
    ASSERT_EQ(kvsimLogEntry(0, &record), 1);
    EXPECT_EQ(record.propertyId, static_cast<uint32_t>(kvsimConditionIntfRemoteWakeup));
    EXPECT_EQ(record.size1, 0xC0FFEEu);
  }
  SvCleanupProc procedure = nullptr;
  uint64_t argument = 0;
  int32_t mode = 0;
  ASSERT_EQ(svsimLastCleanup(&procedure, &argument, &mode), 1);
  EXPECT_EQ(procedure, &kvsvSessionAbort);
  EXPECT_EQ(argument, s);
  EXPECT_EQ(mode, 6);
  // A wait held at the driver's door has registered already.
  ASSERT_EQ(kvsimHold("kvWait"), 0);
  auto waiting = std::async(std::launch::async, [s] {
    uint32_t value = 0;
    return kvsvSessionWait(s, kvsimConditionIntfCommunicating, 0, &value, 2.5);
  });
  ASSERT_EQ(kvsimWaitParked("kvWait", 1), 1);
  EXPECT_EQ(svsimCleanupRegistrations(), registrations + 1);
  ASSERT_EQ(kvsimRaiseCondition(s, kvsimConditionIntfCommunicating, 0), 0);
  ASSERT_EQ(kvsimRelease("kvWait"), 0);
  EXPECT_EQ(waiting.get(), 0);
  // A long loop of blocking waits still holds the one abort of the session.
  for (int i = 0; i < 1000; ++i) {
    uint32_t value = 0;
    ASSERT_EQ(kvsvSessionWait(s, kvsimConditionIntfCommunicating, 0, &value, 1.0), 0);
  }
  EXPECT_EQ(svsimCleanupRegistrations(), registrations + 1001);
  EXPECT_EQ(svsimPendingCleanups(), 1);
}

}  // namespace
