// Steady XY and waveform reads of 16 signals and 100 samples per call, with the driver's part
// reduced to writing its regions: the library's cost per sample, and the host allocations of a
// steady call (0).
#include <benchmark/benchmark.h>

#include <chrono>
#include <climits>
#include <mutex>
#include <string>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/session_manager.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;
using Clock = std::chrono::steady_clock;

constexpr int32_t kSignals = 16;
constexpr int32_t kSamples = 100;

// A signal input session of the mode with a slot in the library, whose reads only fill.
uint32_t FilledSession(uint32_t mode) {
  kvsimReset();
  kvsimSetCallLog(0);
  std::string list;
  for (int i = 0; i < kSignals; ++i) list += (i ? ",S" : "S") + std::to_string(i);
  uint32_t session = 0;
  if (kvCreateSession(":memory:", "", list.c_str(), "CAN1", mode, &session) < 0) return 0;
  std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
  if (CreateSlot(gSessionManager, session, 0) < 0) return 0;
  kvsimSetSignalReadFill(session, INT32_MAX);
  return session;
}

uint64_t HostOperations() { return svsimAllocCount() + svsimResizeCount() + svsimFreeCount(); }

// Times the steady loop of `read`, then reports per sample and per call.
template <class Read>
void RunSteady(benchmark::State &state, Read read) {
  const uint64_t before = HostOperations();
  const Clock::time_point start = Clock::now();
  for (auto _ : state) benchmark::DoNotOptimize(read());
  const double ns = std::chrono::duration<double, std::nano>(Clock::now() - start).count();
  const double samples = static_cast<double>(state.iterations()) * kSignals * kSamples;
  state.SetItemsProcessed(state.iterations() * kSignals * kSamples);
  state.counters["ns_per_sample"] = ns / samples;
  state.counters["host_allocs_per_call"] =
      static_cast<double>(HostOperations() - before) / static_cast<double>(state.iterations());
}

void BM_SteadyReadSignalXY(benchmark::State &state) {
  const uint32_t session = FilledSession(kvMode_SignalInXY);
  SvHandle clusters = nullptr;
  if (session == 0 || kvsvReadSignalXY(session, kSamples, nullptr, &clusters) != 0 ||
      *static_cast<int32_t *>(*clusters) != kSignals) {
    state.SkipWithError("the first read did not deliver every signal");
    return;
  }
  RunSteady(state, [&] { return kvsvReadSignalXY(session, kSamples, nullptr, &clusters); });
  SvHandle *elements = reinterpret_cast<SvHandle *>(static_cast<char *>(*clusters) + 8);
  for (int i = 0; i < 2 * kSignals; ++i) svDisposeHandle(elements[i]);
  svDisposeHandle(clusters);
  kvClear(session);
}
BENCHMARK(BM_SteadyReadSignalXY);

void BM_SteadyReadSignalWaveform(benchmark::State &state) {
  const uint32_t session = FilledSession(kvMode_SignalInWaveform);
  SvWaveformArray *waveforms = svsimMakeWaveformArray(0, 0);
  if (session == 0 || kvsvReadSignalWaveform(session, kSamples, waveforms, 0.0) != 0 ||
      svsimWaveformCount(waveforms) != kSignals) {
    svsimDisposeWaveformArray(waveforms);
    state.SkipWithError("the first read did not deliver every signal");
    return;
  }
  RunSteady(state, [&] { return kvsvReadSignalWaveform(session, kSamples, waveforms, 0.0); });
  svsimDisposeWaveformArray(waveforms);
  kvClear(session);
}
BENCHMARK(BM_SteadyReadSignalWaveform);

}  // namespace
