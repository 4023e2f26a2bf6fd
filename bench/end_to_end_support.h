// What the end-to-end benchmarks share: sessions made through the library as a program makes them,
// the thread's own CPU time, the host's allocation count, and one report of a figure beside its
// floor, both measured in the same run for the same number of calls.
#ifndef KVSVAPI_BENCH_END_TO_END_SUPPORT_H
#define KVSVAPI_BENCH_END_TO_END_SUPPORT_H

#include <benchmark/benchmark.h>
#include <time.h>

#include <cstdint>
#include <cstring>
#include <string>

#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace kvsvbench {

// Time this thread ran, so that a build on the other core slows neither loop's figure.
inline double ThreadCpuNs() {
  timespec t{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
  return static_cast<double>(t.tv_sec) * 1e9 + static_cast<double>(t.tv_nsec);
}

inline uint64_t HostAllocations() { return svsimAllocCount() + svsimResizeCount(); }

// A session created through the library and held by its host reference, as a program holds it;
// cleared with its reference when it goes.
class cLibrarySession {
 public:
  cLibrarySession(const char *database, const char *list, const char *interfaceName,
                  uint32_t mode) {
    if (kvsvSessionManualCreate(database, "", list, interfaceName, mode, &reference_) != 0) return;
    for (int32_t i = 0; i < svsimRefCount(); ++i) {
      SvsimRefInfo info{};
      if (svsimGetRef(i, &info) == 1 && info.cookie == reference_) handle_ = info.handle;
    }
  }
  ~cLibrarySession() { kvsvSessionClear(handle_, reference_); }
  cLibrarySession(const cLibrarySession &) = delete;
  cLibrarySession &operator=(const cLibrarySession &) = delete;
  uint32_t handle() const { return handle_; }

 private:
  kvsvRefnum reference_ = 0;
  uint32_t handle_ = 0;
};

// A driver session with no slot in the library, for the floors; cleared when it goes.
class cDriverSession {
 public:
  cDriverSession(const char *database, const char *list, const char *interfaceName, uint32_t mode) {
    if (kvCreateSession(database, "", list, interfaceName, mode, &handle_) < 0) handle_ = 0;
  }
  ~cDriverSession() {
    if (handle_ != 0) kvClear(handle_);
  }
  cDriverSession(const cDriverSession &) = delete;
  cDriverSession &operator=(const cDriverSession &) = delete;
  uint32_t handle() const { return handle_; }

 private:
  uint32_t handle_ = 0;
};

// A host array of 8-byte elements (doubles or handles): count at byte 0, elements from byte 8.
inline SvHandle DoubleArray(const double *values, int32_t count) {
  SvHandle array = svNewHandleClr(8 + static_cast<size_t>(count) * 8);
  std::memcpy(*array, &count, 4);
  std::memcpy(static_cast<uint8_t *>(*array) + 8, values, static_cast<size_t>(count) * 8);
  return array;
}
inline int32_t ArrayCountOf(SvHandle array) {
  int32_t count = -1;
  if (array != nullptr && *array != nullptr) std::memcpy(&count, *array, 4);
  return count;
}
inline double DoubleAt(SvHandle array, int32_t i) {
  double value;
  std::memcpy(&value, static_cast<const uint8_t *>(*array) + 8 + 8 * i, 8);
  return value;
}

// Frames and spare handles of a read or conversion: every payload handle the frames block has room
// for (the library keeps them past the count for later calls) and every spare go with them.
inline void DisposeFrameArrays(SvHandle frames, SvHandle spares, uint32_t stride = 32,
                               uint32_t payloadOffset = 16) {
  if (frames != nullptr) {
    const size_t capacity = (svGetHandleSize(frames) - 8) / stride;
    for (size_t i = 0; i < capacity; ++i) {
      SvHandle payload;
      std::memcpy(&payload, static_cast<uint8_t *>(*frames) + 8 + i * stride + payloadOffset, 8);
      if (payload != nullptr) svDisposeHandle(payload);
    }
    svDisposeHandle(frames);
  }
  if (spares != nullptr) {
    for (int32_t i = 0; i < ArrayCountOf(spares); ++i) {
      SvHandle spare;
      std::memcpy(&spare, static_cast<uint8_t *>(*spares) + 8 + 8 * i, 8);
      if (spare != nullptr) svDisposeHandle(spare);
    }
    svDisposeHandle(spares);
  }
}

// Times `calls` rounds of `round` on this thread's CPU clock; -1 when a round fails.
template <class Round>
double TimeRounds(int64_t calls, Round round) {
  const double start = ThreadCpuNs();
  for (int64_t i = 0; i < calls; ++i)
    if (!round()) return -1.0;
  return ThreadCpuNs() - start;
}

struct tTimes {
  double ourNs = 0, floorNs = 0;
  uint64_t allocations = 0;  // of the host, in our rounds
  bool failed = false;
};

// Runs the state's loop of `ours` after a first round that sizes every host object and must
// satisfy `delivered`, and after every block of our rounds as many rounds of `floor`, untimed by
// the state, so that a busy machine weighs on both alike.
template <class Ours, class Delivered, class Floor>
tTimes TimeBesideFloor(benchmark::State &state, Ours ours, Delivered delivered, Floor floor) {
  constexpr int64_t kBlock = 64;
  tTimes times;
  if (!ours() || !delivered()) {
    state.SkipWithError("the first round did not deliver what was written");
    times.failed = true;
    return times;
  }
  auto floorBlock = [&](int64_t rounds) {
    const double start = ThreadCpuNs();
    for (int64_t i = 0; i < rounds && !times.failed; ++i) times.failed = !floor();
    times.floorNs += ThreadCpuNs() - start;
  };
  int64_t inBlock = 0;
  uint64_t allocationsBefore = HostAllocations();
  double start = ThreadCpuNs();
  for (auto _ : state) {
    if (!ours()) {
      times.failed = true;
      break;
    }
    if (++inBlock < kBlock) continue;
    times.ourNs += ThreadCpuNs() - start;
    times.allocations += HostAllocations() - allocationsBefore;
    state.PauseTiming();
    floorBlock(inBlock);
    state.ResumeTiming();
    inBlock = 0;
    allocationsBefore = HostAllocations();
    start = ThreadCpuNs();
  }
  times.ourNs += ThreadCpuNs() - start;
  times.allocations += HostAllocations() - allocationsBefore;
  floorBlock(inBlock);
  if (times.failed) state.SkipWithError("a round failed");
  return times;
}

// Items per call, our time and the floor's over the same calls, and the host allocations of our
// loop. `items_per_second` is Google Benchmark's own rate; the counters are this thread's.
inline void ReportBesideFloor(benchmark::State &state, int64_t itemsPerCall, const tTimes &t) {
  const double calls = static_cast<double>(state.iterations());
  const double items = calls * static_cast<double>(itemsPerCall);
  state.SetItemsProcessed(state.iterations() * itemsPerCall);
  state.counters["per_second"] = items / (t.ourNs * 1e-9);
  state.counters["floor_per_second"] = items / (t.floorNs * 1e-9);
  state.counters["ratio_to_floor"] = t.ourNs / t.floorNs;
  state.counters["host_allocs_per_call"] = static_cast<double>(t.allocations) / calls;
}

// Frames, or samples, per call.
inline void Batches(benchmark::internal::Benchmark *b) {
  b->ArgName("batch")->Arg(1)->Arg(16)->Arg(256)->Arg(1000);
}

}  // namespace kvsvbench

#endif
