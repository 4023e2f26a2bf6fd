// Steady frame reads and writes, in nanoseconds per frame, beside a floor: the same bytes moved
// from records to clusters and payload blocks by plain code, with no host and no driver. The
// driver's part is reduced to a memcpy of a ready record stream, so what is left is the library.
#include <benchmark/benchmark.h>

#include <time.h>

#include <cstdint>
#include <cstring>
#include <vector>

#include "core/host_handles.h"
#include "frame/frame_record.h"
#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/session_manager.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

// Time this thread ran, so that a busy machine slows neither loop's figure.
double ThreadCpuNs() {
  timespec t{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
  return static_cast<double>(t.tv_sec) * 1e9 + static_cast<double>(t.tv_nsec);
}

uint32_t OpenSession(const char *interfaceName, uint32_t mode, bool canFd) {
  uint32_t session = 0;
  if (kvCreateSession(":memory:", "", "", interfaceName, mode, &session) < 0) return 0;
  if (canFd) {
    const uint32_t on = 1, limit = 64;
    kvSetProperty(session, kvPropSession_IntfCanIoMode, sizeof on, &on);
    kvSetProperty(session, kvPropSession_PayldLenMax, sizeof limit, &limit);
  }
  std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
  CreateSlot(gSessionManager, session, 0);
  return session;
}

// `count` records of `length` payload bytes each, as the driver hands them over.
std::vector<uint8_t> RecordStream(int count, uint32_t length, bool fixedForm) {
  const uint32_t step = fixedForm ? kFixedRecordSize : RecordSize(length);
  std::vector<uint8_t> stream(static_cast<size_t>(count) * step);
  for (int i = 0; i < count; ++i) {
    uint8_t *record = stream.data() + static_cast<size_t>(i) * step;
    StoreU64(record + kRecordTimestamp, 132000000000000000ull + 10000ull * i);
    StoreU32(record + kRecordIdentifier, 0x100u + static_cast<uint32_t>(i % 0x700));
    record[kRecordPayloadLength] = static_cast<uint8_t>(length);
    for (uint32_t b = 0; b < length; ++b) record[kRecordPayload + b] = static_cast<uint8_t>(i + b);
  }
  return stream;
}

// The floor: records to clusters and payload handles, each field as the library sets it.
struct tFloorCluster {
  int64_t seconds;
  uint64_t fraction;
  SvHandle payload;
  uint32_t identifier;
  uint8_t type, extended, echo, pad;
};

double FloorNsPerFrame(const std::vector<uint8_t> &stream, int count, bool fixedForm,
                       int64_t iterations) {
  std::vector<tFloorCluster> clusters(static_cast<size_t>(count));
  for (tFloorCluster &c : clusters) c.payload = svNewHandleClr(64 + kPayloadHandleExtra);
  // The driver's part, as in the library's loop: the stream copied into the reader's buffer.
  std::vector<uint8_t> buffer(stream.size());
  const double start = ThreadCpuNs();
  for (int64_t it = 0; it < iterations; ++it) {
    std::memcpy(buffer.data(), stream.data(), stream.size());
    const uint8_t *record = buffer.data();
    for (int i = 0; i < count; ++i) {
      tFloorCluster &c = clusters[i];
      uint64_t raw = LoadU64(record + kRecordTimestamp);
      if (raw > 118653335999999999ull) raw -= 95616288000000000ull;
      c.seconds = static_cast<int64_t>(raw / 10000000u);
      c.fraction = (raw % 10000000u) * 1844674407370ull;
      const uint32_t id = LoadU32(record + kRecordIdentifier);
      c.identifier = id & kCanIdentifierMask;
      c.extended = (id >> 29) & 1u;
      c.echo = record[kRecordFlags] >> 7;
      c.type = record[kRecordType];
      uint32_t length = record[kRecordPayloadLength];
      // Hide the length's range, or the compiler may inline the copy as a string move, whose
      // start-up costs more than the copy of a few bytes.
      benchmark::DoNotOptimize(length);
      uint8_t *block = static_cast<uint8_t *>(*c.payload);
      std::memcpy(block, &length, 4);
      std::memcpy(block + 4, record + kRecordPayload, length);
      record += fixedForm ? kFixedRecordSize : RecordSize(length);
    }
    benchmark::DoNotOptimize(clusters.data());
    benchmark::ClobberMemory();
  }
  const double ns = (ThreadCpuNs() - start) / static_cast<double>(iterations * count);
  for (tFloorCluster &c : clusters) svDisposeHandle(c.payload);
  return ns;
}

uint64_t HostAllocations() { return svsimAllocCount() + svsimResizeCount(); }

void ReportPerFrame(benchmark::State &state, int count, uint64_t allocationsBefore) {
  state.SetItemsProcessed(state.iterations() * count);
  state.counters["host_allocs_per_call"] =
      static_cast<double>(HostAllocations() - allocationsBefore) /
      static_cast<double>(state.iterations());
}

void ReadFrames(benchmark::State &state, uint32_t length, bool canFd) {
  kvsimReset();
  kvsimSetCallLog(0);
  const int count = static_cast<int>(state.range(0));
  const uint32_t session = OpenSession("CAN2", kvMode_FrameInStream, canFd);
  const std::vector<uint8_t> stream = RecordStream(count, length, !canFd);
  kvsimSetReadStream(session, stream.data(), static_cast<uint32_t>(stream.size()), 1);
  SvHandle frames = nullptr, spares = nullptr;
  if (kvsvReadFrameCAN(session, count, &frames, &spares, 0.0) < 0 || ArrayCount(frames) != count) {
    state.SkipWithError("first read did not deliver the stream");
    return;
  }
  const uint64_t allocationsBefore = HostAllocations();
  const double start = ThreadCpuNs();
  for (auto _ : state) benchmark::DoNotOptimize(kvsvReadFrameCAN(session, count, &frames, &spares, 0.0));
  const double ns = (ThreadCpuNs() - start) / static_cast<double>(state.iterations() * count);
  ReportPerFrame(state, count, allocationsBefore);
  const double floor = FloorNsPerFrame(stream, count, !canFd, state.iterations());
  state.counters["ns_per_frame"] = ns;
  state.counters["floor_ns_per_frame"] = floor;
  state.counters["ratio_to_floor"] = ns / floor;
  for (int i = 0; i < ArrayCount(frames); ++i) {
    SvHandle payload = nullptr;
    std::memcpy(&payload, static_cast<char *>(*frames) + kArrayHeader + i * tFrameClusterCAN::kSize +
                              tFrameClusterCAN::kPayload, sizeof payload);
    svDisposeHandle(payload);
  }
  svDisposeHandle(frames);
  svDisposeHandle(spares);
  kvClear(session);
  kvsimSetCallLog(1);
}

void BM_ReadFrameCAN(benchmark::State &state) { ReadFrames(state, 8, false); }
void BM_ReadFrameCANFD64(benchmark::State &state) { ReadFrames(state, 64, true); }

void BM_WriteFrameCAN(benchmark::State &state) {
  kvsimReset();
  kvsimSetCallLog(0);
  const int count = static_cast<int>(state.range(0));
  const uint32_t session = OpenSession("CAN1", kvMode_FrameOutStream, false);
  kvsimSetWriteSink(session, 1);
  SvHandle frames = svNewHandleClr(kArrayHeader + static_cast<size_t>(count) * tFrameClusterCAN::kSize);
  ArrayCount(frames) = count;
  std::vector<SvHandle> payloads;
  for (int i = 0; i < count; ++i) {
    SvHandle payload = svNewHandleClr(4 + 8);
    *static_cast<int32_t *>(*payload) = 8;
    uint8_t *element = static_cast<uint8_t *>(*frames) + kArrayHeader + i * tFrameClusterCAN::kSize;
    std::memcpy(element + tFrameClusterCAN::kPayload, &payload, sizeof payload);
    StoreU32(element + tFrameClusterCAN::kIdentifier, 0x100u + static_cast<uint32_t>(i));
    payloads.push_back(payload);
  }
  if (kvsvWriteFrameCAN(session, frames, 0.0) < 0) {
    state.SkipWithError("first write refused");
    return;
  }
  const uint64_t allocationsBefore = HostAllocations();
  for (auto _ : state) benchmark::DoNotOptimize(kvsvWriteFrameCAN(session, frames, 0.0));
  ReportPerFrame(state, count, allocationsBefore);
  for (SvHandle payload : payloads) svDisposeHandle(payload);
  svDisposeHandle(frames);
  kvClear(session);
  kvsimSetCallLog(1);
}

BENCHMARK(BM_ReadFrameCAN)->Arg(1)->Arg(100)->Arg(1000);
BENCHMARK(BM_ReadFrameCANFD64)->Arg(1)->Arg(100)->Arg(1000);
BENCHMARK(BM_WriteFrameCAN)->Arg(1)->Arg(100)->Arg(1000);

}  // namespace
