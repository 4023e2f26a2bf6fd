// Steady reads of a database property of each shape into the same host handle, on objects of a
// field database: the time per read and the host handles made, resized and freed per read.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <string>
#include <vector>

#include "core/host_handles.h"
#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace {

using nKVSVAPI100::DisposeHandleArray;

// The objects read from: the first cluster, its first frame and that frame's first signal.
struct tObjects {
  uint32_t database = 0, cluster = 0, frame = 0, signal = 0;
};

uint32_t FirstHandle(uint32_t object, uint32_t id) {
  uint32_t size = 0;
  if (object == 0 || kvdbGetPropertySize(object, id, &size) < 0 || size < 4) return 0;
  std::vector<uint32_t> handles(size / 4);
  return kvdbGetProperty(object, id, size, handles.data()) < 0 ? 0 : handles[0];
}

tObjects OpenTesla() {
  kvsimReset();
  kvsimSetCallLog(0);
  tObjects objects;
  const std::string path = std::string(KVSV_DBC_DIR) + "/tesla_can.dbc";
  if (kvdbOpenDatabase(path.c_str(), &objects.database) < 0) return {};
  objects.cluster = FirstHandle(objects.database, kvPropDatabase_ClstRefs);
  objects.frame = FirstHandle(objects.cluster, kvPropClst_FrmRefs);
  objects.signal = FirstHandle(objects.frame, kvPropFrm_SigRefs);
  return objects;
}

// A read of one shape into `*value` (a scalar's read ignores it).
using tRead = kvsvStatus (*)(const tObjects &, SvHandle *);

template <class tValue, kvsvStatus (*get)(uint32_t, uint32_t, tValue *, SvHandle *), uint32_t id>
kvsvStatus ReadScalar(const tObjects &o, SvHandle *) {
  tValue value{};
  const uint32_t object = (id & 0xFF0000u) == 0x10000u   ? o.cluster
                          : (id & 0xFF0000u) == 0x20000u ? o.frame
                                                         : o.signal;
  const kvsvStatus status = get(object, id, &value, nullptr);
  benchmark::DoNotOptimize(value);
  return status;
}

template <kvsvStatus (*get)(uint32_t, uint32_t, SvHandle *, SvHandle *), uint32_t id>
kvsvStatus ReadHandle(const tObjects &o, SvHandle *value) {
  return get((id & 0xFF0000u) == 0x20000u ? o.frame : o.signal, id, value, nullptr);
}

void DisposeString(SvHandle *value) {
  if (*value != nullptr) svDisposeHandle(*value);
}

// An array of 16-byte clusters from byte 8, each with its string first.
void DisposeMapping(SvHandle *value) {
  for (int32_t i = 0; i < *static_cast<int32_t *>(**value); ++i)
    svDisposeHandle(*reinterpret_cast<SvHandle *>(static_cast<char *>(**value) + 8 + 16 * i));
  svDisposeHandle(*value);
}

void SteadyRead(benchmark::State &state, tRead read, void (*dispose)(SvHandle *)) {
  const tObjects objects = OpenTesla();
  SvHandle value = nullptr;
  if (objects.signal == 0 || read(objects, &value) < 0) {
    state.SkipWithError("the database or the first read failed");
    return;
  }
  svsimResetCounters();
  for (auto _ : state) benchmark::DoNotOptimize(read(objects, &value));
  const auto perCall = [&](uint64_t count) {
    return static_cast<double>(count) / static_cast<double>(state.iterations());
  };
  state.counters["host_allocs_per_call"] = perCall(svsimAllocCount());
  state.counters["host_resizes_per_call"] = perCall(svsimResizeCount());
  state.counters["host_frees_per_call"] = perCall(svsimFreeCount());
  dispose(&value);
  kvdbCloseDatabase(objects.database, 1);
}

const struct {
  const char *name;
  tRead read;
  void (*dispose)(SvHandle *);
} kShapes[] = {
    {"U32", ReadScalar<uint32_t, kvsvdbGetPropU32, kvPropSig_StartBit>, DisposeString},
    {"U64", ReadScalar<uint64_t, kvsvdbGetPropU64, kvPropClst_BaudRate64>, DisposeString},
    {"F64", ReadScalar<double, kvsvdbGetPropF64, kvPropSig_ScaleFac>, DisposeString},
    {"Bool", ReadScalar<uint8_t, kvsvdbGetPropBool, kvPropFrm_CANExtID>, DisposeString},
    {"U8_1D", ReadHandle<kvsvdbGetPropU8_1D, kvPropFrm_DefaultPayload>, DisposeString},
    {"U32_1D", ReadHandle<kvsvdbGetPropU32_1D, kvPropFrm_PDUStartBits>, DisposeString},
    {"String", ReadHandle<kvsvdbGetPropString, kvPropSig_Name>, DisposeString},
    {"Ref", ReadHandle<kvsvdbGetPropRef, kvPropSig_FrameRef>, DisposeString},
    {"Ref1D", ReadHandle<kvsvdbGetPropRef1D, kvPropFrm_SigRefs>, DisposeHandleArray},
    {"PDU_Mapping", ReadHandle<kvsvdbGetPropPDU_Mapping, kvPropFrm_PDU_Mapping>, DisposeMapping},
};

const bool kRegistered = [] {
  for (const auto &shape : kShapes) {
    benchmark::RegisterBenchmark((std::string("BM_SteadyDbPropertyRead/") + shape.name).c_str(),
                                 SteadyRead, shape.read, shape.dispose);
  }
  return true;
}();

}  // namespace
