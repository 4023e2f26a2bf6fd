// The guarded fast path: a steady single-point read, slot lookup, guard, size test, driver call.
#include <benchmark/benchmark.h>

#include <mutex>
#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/session_manager.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

void BM_GuardedSignalRead(benchmark::State &state) {
  kvsimReset();
  const int signals = static_cast<int>(state.range(0));
  std::string list;
  for (int i = 0; i < signals; ++i) list += (i ? ",Sig" : "Sig") + std::to_string(i);
  uint32_t session = 0;
  if (kvCreateSession(":memory:", "", list.c_str(), "CAN1", kvMode_SignalInSinglePoint, &session) < 0) {
    state.SkipWithError("driver refused the session");
    return;
  }
  {
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    CreateSlot(gSessionManager, session, 0);
  }
  SvHandle values = nullptr;
  kvsvReadSignalSinglePoint(session, &values);
  const uint64_t allocationsBefore = svsimAllocCount() + svsimResizeCount();
  for (auto _ : state) benchmark::DoNotOptimize(kvsvReadSignalSinglePoint(session, &values));
  state.counters["host_allocs_per_call"] = benchmark::Counter(
      static_cast<double>(svsimAllocCount() + svsimResizeCount() - allocationsBefore) /
      static_cast<double>(state.iterations()));
  svDisposeHandle(values);
  kvClear(session);
}
BENCHMARK(BM_GuardedSignalRead)->Arg(1)->Arg(16)->Arg(128);

}  // namespace
