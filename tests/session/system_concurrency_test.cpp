// Host programs opening and closing system objects from several threads at once: the count, the
// driver's system, the error sessions and the host references must all come out even.
#include <gtest/gtest.h>

#include <atomic>
#include <cstdint>
#include <string>
#include <thread>
#include <vector>

#include "session/system_fixture.h"

namespace {

constexpr int kThreads = 6;
constexpr int kRounds = 150;

// Each thread has an interface of its own, so that its host reference is only ever removed by
// its own close (two names of one interface would share a handle); the devices are shared by all.
const char *const kInterfaceOf[kThreads] = {"CAN1",     "can2",          "LIN1",
                                            "FlexRay2", "enet1/monitor", "CAN4"};

using SystemConcurrency = SystemFixture;

// Runs `body(thread, round)` on every thread while another thread reads the count without the
// lock, as host programs do; counts the rounds in which `body` saw something wrong.
template <typename Body>
int RunThreads(Body body) {
  std::atomic<int> failures{0};
  std::atomic<bool> done{false};
  std::thread reader([&] {
    while (!done.load()) static_cast<void>(kvsvGetSystemRefCount());
  });
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      for (int round = 0; round < kRounds; ++round)
        if (!body(t, round)) failures.fetch_add(1);
    });
  }
  for (std::thread &thread : threads) thread.join();
  done.store(true);
  reader.join();
  return failures.load();
}

TEST_F(SystemConcurrency, ParallelOpensAndClosesComeOutEven) {
  std::vector<SvHandle> interfaces, devices;
  for (int t = 0; t < kThreads; ++t) {
    interfaces.push_back(*Name(kInterfaceOf[t]));
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
    const SvRefnum reference = RegisterHostRef(kInterfaceOf[t], intf, "KVOR Interface");
    // Closes in another order than the opens, one through the close of another class.
    ok = ok && kvsvInterfaceClose(intf) == 0 && kvsvSystemClose(device) == 0 &&
         kvsvSystemClose(system) == 0;
    return ok && !HostHasRef(reference);
  });

  EXPECT_EQ(failures, 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), kvsimCountCalls("kvSystemClose"));
  EXPECT_GE(kvsimCountCalls("kvSystemOpen"), 1);
  EXPECT_EQ(svsimRefCount(), 0);
}

TEST_F(SystemConcurrency, ErrorChildrenKeepTheirAcquiresUnderContention) {
  std::vector<SvHandle> missing;
  for (int t = 0; t < kThreads; ++t)
    missing.push_back(*Name(("nowhere" + std::to_string(t)).c_str()));
  const int failures = RunThreads([&](int t, int round) {
    SvHandle name = missing[t];
    uint32_t system = 0, handle = 0;
    bool ok = kvsvSystemOpen(nullptr, &system) == 0 && kvsvInterfaceOpen(&name, &handle) == 0 &&
              (handle >> 24) == 0x20u;
    // The error handle ends through a close of another class, or the session close.
    ok = ok && (round % 2 == 0 ? kvsvDeviceClose(handle) : kvsvSessionClose(handle)) == 0;
    return ok && kvsvSystemClose(system) == 0;
  });

  EXPECT_EQ(failures, 0);
  // Only the acquires of the error children are still out.
  EXPECT_EQ(kvsvGetSystemRefCount(), static_cast<uint32_t>(kThreads * kRounds));
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvsimOpenSessionCount(), 0) << "every error session was cleared";

  uint64_t a = 0, b = 0;
  EXPECT_EQ(kvsvSystemManualClose(&a, &b), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
}

TEST_F(SystemConcurrency, ParallelReleasesCloseTheSystemExactlyOnce) {
  constexpr int kHolders = 64;
  std::vector<uint32_t> handles(kHolders);
  for (int i = 0; i < kHolders; ++i) ASSERT_EQ(kvsvSystemOpen(nullptr, &handles[i]), 0);
  ASSERT_EQ(kvsvGetSystemRefCount(), static_cast<uint32_t>(kHolders));
  kvsimLogClear();

  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      for (int i = t; i < kHolders; i += kThreads) kvsvSystemClose(handles[i]);
    });
  }
  for (std::thread &thread : threads) thread.join();

  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
}

}  // namespace
