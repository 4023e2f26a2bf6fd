// kvsvWriteSignalWaveform: the samples of the host's waveforms, one waveform per signal, taken by
// the driver straight from the waveforms' own storage. Every waveform is cut to the shortest.
#include <algorithm>

#include "core/internal_error.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"
#include "signal/waveform_array.h"
#include "signal/waveform_scratch.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineUnlockFailed = 4392;

// The size of each sample buffer: the shortest waveform's samples. With no waveforms the count
// stays at its starting maximum, and its byte size wraps as the driver has always been given it.
uint32_t ShortestBufferSize(const tWaveformScratch &scratch, int32_t count) {
  uint32_t shortest = 0xFFFFFFFFu;
  for (int32_t i = 0; i < count; ++i) {
    scratch.sampleBuffers[i] = scratch.descriptors[i].samples;
    shortest = std::min(shortest, scratch.descriptors[i].numSamples);
  }
  return shortest * 8u;
}

Status WriteWaveforms(tSessionSlot &slot, uint32_t session, SvWaveformArray &waveforms,
                      double timeout) {
  const int32_t count = WaveformCount(waveforms);
  Status status = 0;
  // The scratch record is part of the test: a single-point read of the session may have set the
  // shared count without making it.
  if (count != slot.cachedCount || slot.waveformScratch == nullptr) {
    int32_t listed = 0;
    status = kvGetProperty(session, kvPropSession_NumInList, 4, &listed);
    if (status < 0) return status;
    if (listed != count) return kvErrElementCountMismatch;
    slot.cachedCount = count;
    const eScratchBuilt built = BuildWaveformScratch(slot, count);
    if (built == eScratchBuilt::kNoRecord) return kvErrOutOfMemory;
    if (built == eScratchBuilt::kNoArrays) {
      slot.cachedCount = kUnknown;
      status = kvErrOutOfMemory;
    }
  }
  tWaveformScratch &scratch = *slot.waveformScratch;
  if (status >= 0) {
    if (LockWaveforms(waveforms, kLockToTake, count, scratch.descriptors) != 0) {
      status = kvErrOutOfMemory;
    } else {
      const uint32_t bufferSize = ShortestBufferSize(scratch, count);
      RegisterAbortIfBlocking(session, timeout);
      status = kvhdnWriteSignalWaveform(session, timeout, scratch.sampleBuffers, bufferSize);
    }
  }
  // Also after a failed Lock: the host takes an Unlock of an array it did not lock.
  if (count != 0 && UnlockWaveforms(waveforms, count, scratch.descriptors) != 0) {
    const Status reported =
        ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, kLineUnlockFailed, 0);
    if (reported != 0 && status >= 0) status = reported;
  }
  return status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteSignalWaveform(uint32_t session,
                                                          SvWaveformArray *waveforms,
                                                          double timeout) {
  if (waveforms == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  const Status status = WriteWaveforms(slot, session, *waveforms, timeout);
  if (status < 0) slot.cachedCount = kUnknown;
  return status;
}
