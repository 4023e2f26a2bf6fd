// Steady conversions of a 20-frame CAN session, in nanoseconds per frame: values to frames into
// arrays sized by the first call, and frames back to values, with the host allocations of a
// steady call as a counter (0). The driver stand-in's own packing and unpacking, with its
// database engine, is part of each figure.
#include <benchmark/benchmark.h>
#include <time.h>

#include <cstdint>
#include <string>
#include <vector>

#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/session_manager.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

constexpr int kFrames = 20;

std::string TeslaPath() { return std::string(KVSV_DBC_DIR) + "/tesla_can.dbc"; }

double ThreadCpuNs() {
  timespec t{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
  return static_cast<double>(t.tv_sec) * 1e9 + static_cast<double>(t.tv_nsec);
}

std::string Text(uint32_t object, uint32_t id) {
  char text[256] = {};
  kvdbGetProperty(object, id, sizeof text, text);
  return text;
}

std::vector<uint32_t> Handles(uint32_t object, uint32_t id) {
  uint32_t size = 0;
  kvdbGetPropertySize(object, id, &size);
  std::vector<uint32_t> handles(size / 4);
  if (!handles.empty()) kvdbGetProperty(object, id, size, handles.data());
  return handles;
}

// One signal of each of the first frames of the database that have one: a list of `kFrames`
// frames.
std::string TwentyFrameList() {
  uint32_t database = 0;
  if (kvdbOpenDatabase(TeslaPath().c_str(), &database) < 0) return "";
  std::string list;
  int frames = 0;
  for (uint32_t cluster : Handles(database, kvPropDatabase_ClstRefs)) {
    for (uint32_t frame : Handles(cluster, kvPropClst_FrmRefs)) {
      const std::vector<uint32_t> signals = Handles(frame, kvPropFrm_SigRefs);
      if (signals.empty() || frames == kFrames) continue;
      list += (list.empty() ? "" : ",") + Text(frame, kvPropFrm_Name) + "." +
              Text(signals[0], kvPropSig_Name);
      ++frames;
    }
  }
  kvdbCloseDatabase(database, 1);
  return frames == kFrames ? list : "";
}

uint32_t OpenConversion(const std::string &list) {
  uint32_t session = 0;
  if (kvCreateSession(TeslaPath().c_str(), "", list.c_str(), "CAN1",
                      kvMode_SignalConversionSinglePoint, &session) < 0) {
    return 0;
  }
  std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
  CreateSlot(gSessionManager, session, 0);
  return session;
}

uint64_t HostAllocations() { return svsimAllocCount() + svsimResizeCount(); }

void Report(benchmark::State &state, double start, uint64_t allocationsBefore) {
  const double calls = static_cast<double>(state.iterations());
  state.SetItemsProcessed(state.iterations() * kFrames);
  state.counters["ns_per_frame"] = (ThreadCpuNs() - start) / (calls * kFrames);
  state.counters["host_allocs_per_call"] =
      static_cast<double>(HostAllocations() - allocationsBefore) / calls;
}

void DisposeFrames(SvHandle frames, SvHandle spares) {
  for (int32_t i = 0; frames != nullptr && i < *static_cast<int32_t *>(*frames); ++i) {
    SvHandle payload = nullptr;
    std::memcpy(&payload, static_cast<char *>(*frames) + 8 + i * 32 + 16, sizeof payload);
    svDisposeHandle(payload);
  }
  svDisposeHandle(frames);
  svDisposeHandle(spares);
}

void Convert(benchmark::State &state, bool towardsFrames) {
  kvsimReset();
  kvsimSetCallLog(0);
  const std::string list = TwentyFrameList();
  const uint32_t toFrames = OpenConversion(list);
  const uint32_t fromFrames = OpenConversion(list);
  if (toFrames == 0 || fromFrames == 0) {
    state.SkipWithError("no conversion session of twenty frames");
    return;
  }
  SvHandle values = svNewHandleClr(8 + kFrames * 8);
  *static_cast<int32_t *>(*values) = kFrames;
  SvHandle frames = nullptr, spares = nullptr, out = nullptr;
  // The first calls size every host object; the loop then only overwrites them.
  if (kvsvConvertSignalSinglePointToFrameCAN(toFrames, &values, &frames, &spares) < 0 ||
      *static_cast<int32_t *>(*frames) != kFrames ||
      kvsvConvertFrameCANToSignalSinglePoint(fromFrames, &frames, &out) < 0) {
    state.SkipWithError("first conversions failed");
    return;
  }
  const uint64_t allocationsBefore = HostAllocations();
  const double start = ThreadCpuNs();
  if (towardsFrames) {
    for (auto _ : state) {
      benchmark::DoNotOptimize(
          kvsvConvertSignalSinglePointToFrameCAN(toFrames, &values, &frames, &spares));
    }
  } else {
    for (auto _ : state) {
      benchmark::DoNotOptimize(kvsvConvertFrameCANToSignalSinglePoint(fromFrames, &frames, &out));
    }
  }
  Report(state, start, allocationsBefore);
  DisposeFrames(frames, spares);
  svDisposeHandle(values);
  svDisposeHandle(out);
  kvClear(toFrames);
  kvClear(fromFrames);
  kvsimSetCallLog(1);
}

void BM_ConvertSignalsToFramesCAN(benchmark::State &state) { Convert(state, true); }
void BM_ConvertFramesToSignalsCAN(benchmark::State &state) { Convert(state, false); }

BENCHMARK(BM_ConvertSignalsToFramesCAN);
BENCHMARK(BM_ConvertFramesToSignalsCAN);

}  // namespace
