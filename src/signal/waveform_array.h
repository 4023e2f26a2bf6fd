// The host's waveform array as waveform reads and writes use it: the four operations of its
// table, called at their fixed positions, and the descriptor that its Lock fills.
#ifndef KVSVAPI_SIGNAL_WAVEFORM_ARRAY_H
#define KVSVAPI_SIGNAL_WAVEFORM_ARRAY_H

#include <cstddef>
#include <cstdint>

#include "kvsvapi.h"

namespace nKVSVAPI100 {

static_assert(sizeof(SvWaveformDescriptor) == 80, "host layout");
static_assert(offsetof(SvWaveformDescriptor, t0) == 0, "host layout");
static_assert(offsetof(SvWaveformDescriptor, dt) == 16, "host layout");
static_assert(offsetof(SvWaveformDescriptor, numSamples) == 32, "host layout");
static_assert(offsetof(SvWaveformDescriptor, samples) == 48, "host layout");
static_assert(offsetof(SvWaveformArrayOps, GetCount) == 3 * sizeof(void *), "host table");
static_assert(offsetof(SvWaveformArrayOps, Resize) == 6 * sizeof(void *), "host table");
static_assert(offsetof(SvWaveformArrayOps, Lock) == 11 * sizeof(void *), "host table");
static_assert(offsetof(SvWaveformArrayOps, Unlock) == 12 * sizeof(void *), "host table");

// Access of a Lock: 2 while the library fills the waveforms, 1 while it takes their samples.
constexpr int32_t kLockToFill = 2;
constexpr int32_t kLockToTake = 1;
// The constant that every Resize carries; its meaning lies in the host.
constexpr int32_t kWaveformResizeKind = 6;

// The number of waveforms. What GetCount returns is not looked at: a count it did not set is 0.
inline int32_t WaveformCount(SvWaveformArray &waveforms) {
  int32_t count = 0;
  waveforms.ops->GetCount(&waveforms, &count);
  return count;
}

inline int32_t ResizeWaveforms(SvWaveformArray &waveforms, int32_t count, int32_t numSamples) {
  return waveforms.ops->Resize(&waveforms, kWaveformResizeKind, count, numSamples);
}

inline int32_t LockWaveforms(SvWaveformArray &waveforms, int32_t access, int32_t count,
                             SvWaveformDescriptor *descriptors) {
  return waveforms.ops->Lock(&waveforms, access, count, descriptors);
}

inline int32_t UnlockWaveforms(SvWaveformArray &waveforms, int32_t count,
                               SvWaveformDescriptor *descriptors) {
  return waveforms.ops->Unlock(&waveforms, count, descriptors);
}

}  // namespace nKVSVAPI100

#endif
