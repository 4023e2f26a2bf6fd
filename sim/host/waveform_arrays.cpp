// The host's waveform arrays. Each is an object that starts with the host's table of operations;
// each waveform keeps its samples in a handle of the host's memory manager, so that making,
// resizing and freeing samples is counted, and can be made to fail, as any handle is. Every array
// is known while it lives, and each Lock is checked against its Unlock: a second Lock, an Unlock
// of another number of waveforms or the disposal of a locked array stops the process, as using a
// dead handle does.
#include "waveform_arrays.h"

#include <algorithm>
#include <cstring>
#include <mutex>
#include <new>
#include <unordered_set>
#include <vector>

#include "fatal.h"
#include "fault_plan.h"
#include "handle_store.h"
#include "svsim.h"

namespace {

using svhost::Fatal;
using svhost::HandleStore;

// The constant that every Resize of the interface carries.
constexpr int32_t kResizeKind = 6;
constexpr int32_t kAccessWrite = 1;
constexpr int32_t kAccessRead = 2;
constexpr int32_t kNotLocked = -1;
constexpr int kOperations = 13;

struct tWaveform {
  SvHandle samples = nullptr;  // numSamples doubles
  int32_t numSamples = 0;
  SvTime t0{};
  double dt = 1.0;
};

struct tHostWaveformArray : SvWaveformArray {
  std::vector<tWaveform> waveforms;
  int32_t locked = kNotLocked;  // the number of waveforms under the current lock
  uint64_t calls[kOperations] = {};
};

std::mutex gMutex;
std::unordered_set<const SvWaveformArray *> gLive;
uint64_t gStrayUnlocks = 0;

// The live array behind `self`; the process stops for anything else.
tHostWaveformArray &Live(const SvWaveformArray *self, const char *operation) {
  if (gLive.count(self) == 0) Fatal(operation, self, "not a live waveform array");
  return *static_cast<tHostWaveformArray *>(const_cast<SvWaveformArray *>(self));
}

size_t SampleBytes(int32_t numSamples) { return static_cast<size_t>(numSamples) * sizeof(double); }

int32_t ResizeWaveform(tWaveform &waveform, int32_t numSamples) {
  if (waveform.samples != nullptr && waveform.numSamples == numSamples) return 0;
  if (waveform.samples == nullptr) {
    waveform.samples = HandleStore::Instance().Create(SampleBytes(numSamples));
    if (waveform.samples == nullptr) return SVSIM_ERR_MEMORY;
  } else {
    const int32_t status =
        HandleStore::Instance().Resize(waveform.samples, SampleBytes(numSamples), "Resize");
    if (status != 0) return status;
  }
  waveform.numSamples = numSamples;
  return 0;
}

int32_t ResizeArray(tHostWaveformArray &array, int32_t count, int32_t numSamples) {
  while (array.waveforms.size() > static_cast<size_t>(count)) {
    HandleStore::Instance().Dispose(array.waveforms.back().samples, "Resize");
    array.waveforms.pop_back();
  }
  for (tWaveform &waveform : array.waveforms) {
    const int32_t status = ResizeWaveform(waveform, numSamples);
    if (status != 0) return status;
  }
  while (array.waveforms.size() < static_cast<size_t>(count)) {
    tWaveform added;
    const int32_t status = ResizeWaveform(added, numSamples);
    if (status != 0) return status;
    array.waveforms.push_back(added);
  }
  return 0;
}

int32_t GetCount(SvWaveformArray *self, int32_t *count) {
  std::lock_guard<std::mutex> lock(gMutex);
  tHostWaveformArray &array = Live(self, "GetCount");
  ++array.calls[3];
  if (count == nullptr) return SVSIM_ERR_ARGUMENT;
  *count = static_cast<int32_t>(array.waveforms.size());
  return 0;
}

int32_t Resize(SvWaveformArray *self, int32_t kind, int32_t count, int32_t numSamples) {
  std::lock_guard<std::mutex> lock(gMutex);
  tHostWaveformArray &array = Live(self, "Resize");
  ++array.calls[6];
  if (kind != kResizeKind || count < 0 || numSamples < 0) return SVSIM_ERR_ARGUMENT;
  return ResizeArray(array, count, numSamples);
}

int32_t Lock(SvWaveformArray *self, int32_t access, int32_t count,
             SvWaveformDescriptor *descriptors) {
  std::lock_guard<std::mutex> lock(gMutex);
  tHostWaveformArray &array = Live(self, "Lock");
  ++array.calls[11];
  if (array.locked != kNotLocked) Fatal("Lock", self, "locked again before its Unlock");
  if ((access != kAccessRead && access != kAccessWrite) || count < 0 ||
      static_cast<size_t>(count) > array.waveforms.size() ||
      (descriptors == nullptr && count != 0)) {
    return SVSIM_ERR_ARGUMENT;
  }
  if (svhost::FaultPlan::Instance().LockFails()) return SVSIM_ERR_LOCK;
  // Nothing is opened by a lock of no waveforms, so nothing waits for an Unlock.
  if (count == 0) return 0;
  for (int32_t i = 0; i < count; ++i) {
    const tWaveform &waveform = array.waveforms[static_cast<size_t>(i)];
    SvWaveformDescriptor &descriptor = descriptors[i];
    std::memset(&descriptor, 0, sizeof descriptor);
    descriptor.t0 = waveform.t0;
    descriptor.dt = waveform.dt;
    descriptor.numSamples = static_cast<uint32_t>(waveform.numSamples);
    descriptor.samples = static_cast<double *>(*waveform.samples);
  }
  array.locked = count;
  return 0;
}

int32_t Unlock(SvWaveformArray *self, int32_t count, SvWaveformDescriptor *descriptors) {
  std::lock_guard<std::mutex> lock(gMutex);
  tHostWaveformArray &array = Live(self, "Unlock");
  ++array.calls[12];
  // Callers unlock after a Lock that failed as well: the host takes it and counts it.
  if (array.locked == kNotLocked) {
    ++gStrayUnlocks;
    return 0;
  }
  if (count != array.locked) Fatal("Unlock", self, "number of waveforms differs from its Lock");
  if (descriptors == nullptr) Fatal("Unlock", self, "no descriptors for a locked array");
  const size_t kept = std::min(static_cast<size_t>(count), array.waveforms.size());
  for (size_t i = 0; i < kept; ++i) {
    array.waveforms[i].t0 = descriptors[i].t0;
    array.waveforms[i].dt = descriptors[i].dt;
  }
  array.locked = kNotLocked;
  return svhost::FaultPlan::Instance().UnlockFails() ? SVSIM_ERR_LOCK : 0;
}

const SvWaveformArrayOps kOperationTable = {{nullptr, nullptr, nullptr},
                                            GetCount,
                                            {nullptr, nullptr},
                                            Resize,
                                            {nullptr, nullptr, nullptr, nullptr},
                                            Lock,
                                            Unlock};

// The waveform `index` of a live array, or null.
tWaveform *WaveformAt(tHostWaveformArray &array, int32_t index) {
  if (index < 0 || static_cast<size_t>(index) >= array.waveforms.size()) return nullptr;
  return &array.waveforms[static_cast<size_t>(index)];
}

}  // namespace

extern "C" {

SvWaveformArray *svsimMakeWaveformArray(int32_t count, int32_t numSamples) {
  if (count < 0 || numSamples < 0) return nullptr;
  auto *array = new (std::nothrow) tHostWaveformArray;
  if (array == nullptr) return nullptr;
  array->ops = &kOperationTable;
  std::lock_guard<std::mutex> lock(gMutex);
  gLive.insert(array);
  if (ResizeArray(*array, count, numSamples) != 0) {
    ResizeArray(*array, 0, 0);
    gLive.erase(array);
    delete array;
    return nullptr;
  }
  return array;
}

void svsimDisposeWaveformArray(SvWaveformArray *waveforms) {
  if (waveforms == nullptr) return;
  std::lock_guard<std::mutex> lock(gMutex);
  tHostWaveformArray &array = Live(waveforms, "svsimDisposeWaveformArray");
  if (array.locked != kNotLocked) {
    Fatal("svsimDisposeWaveformArray", waveforms, "disposed of while locked: a Lock has no Unlock");
  }
  ResizeArray(array, 0, 0);
  gLive.erase(&array);
  delete &array;
}

int32_t svsimWaveformCount(const SvWaveformArray *waveforms) {
  std::lock_guard<std::mutex> lock(gMutex);
  return static_cast<int32_t>(Live(waveforms, "svsimWaveformCount").waveforms.size());
}

int32_t svsimWaveformRead(const SvWaveformArray *waveforms, int32_t index, double *samples,
                          int32_t capacity, SvTime *t0, double *dt) {
  std::lock_guard<std::mutex> lock(gMutex);
  tWaveform *waveform = WaveformAt(Live(waveforms, "svsimWaveformRead"), index);
  if (waveform == nullptr) return -1;
  const int32_t copied = std::min(std::max(capacity, 0), waveform->numSamples);
  if (samples != nullptr && copied > 0) {
    std::memcpy(samples, *waveform->samples, SampleBytes(copied));
  }
  if (t0 != nullptr) *t0 = waveform->t0;
  if (dt != nullptr) *dt = waveform->dt;
  return waveform->numSamples;
}

int32_t svsimWaveformWrite(SvWaveformArray *waveforms, int32_t index, const double *samples,
                           int32_t numSamples) {
  std::lock_guard<std::mutex> lock(gMutex);
  tHostWaveformArray &array = Live(waveforms, "svsimWaveformWrite");
  tWaveform *waveform = WaveformAt(array, index);
  if (waveform == nullptr || numSamples < 0 || (samples == nullptr && numSamples > 0) ||
      array.locked != kNotLocked) {
    return -1;
  }
  const int32_t status = ResizeWaveform(*waveform, numSamples);
  if (status != 0) return status;
  if (numSamples > 0) std::memcpy(*waveform->samples, samples, SampleBytes(numSamples));
  return 0;
}

int32_t svsimWaveformLocked(const SvWaveformArray *waveforms) {
  std::lock_guard<std::mutex> lock(gMutex);
  return Live(waveforms, "svsimWaveformLocked").locked != kNotLocked ? 1 : 0;
}

uint64_t svsimWaveformCalls(const SvWaveformArray *waveforms, int32_t position) {
  std::lock_guard<std::mutex> lock(gMutex);
  const tHostWaveformArray &array = Live(waveforms, "svsimWaveformCalls");
  if (position < 0 || position >= kOperations) return 0;
  return array.calls[position];
}

uint64_t svsimStrayWaveformUnlocks(void) {
  std::lock_guard<std::mutex> lock(gMutex);
  return gStrayUnlocks;
}

uint64_t svsimLiveWaveformArrays(void) {
  std::lock_guard<std::mutex> lock(gMutex);
  return gLive.size();
}

}  // extern "C"

namespace svhost {

void ResetWaveformArrays() {
  std::lock_guard<std::mutex> lock(gMutex);
  gStrayUnlocks = 0;
}

}  // namespace svhost
