// kvsvReadSignalWaveform: evenly spaced samples of every signal, read by the driver straight into
// the host's waveforms. The library only sizes the array, hands the waveforms' own sample storage
// to the driver and stamps every waveform with the driver's start time and interval.
#include "core/internal_error.h"
#include "core/timestamps.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"
#include "signal/waveform_array.h"
#include "signal/waveform_scratch.h"

using namespace nKVSVAPI100;

namespace {

// Samples per waveform that a read without a time limit asks for when the caller names none.
constexpr int32_t kAllSamples = 10000;
constexpr uint32_t kLineCutFailed = 464;
constexpr uint32_t kLineUnlockFailed = 490;

class cWaveformRead {
 public:
  cWaveformRead(tSessionSlot &slot, uint32_t session, SvWaveformArray &waveforms, double timeout)
      : slot_(slot), session_(session), waveforms_(waveforms), timeout_(timeout) {}

  Status Run(int32_t numSamples) {
    if (numSamples < 0) {
      if (MayBlock(timeout_)) {
        status_ = kvErrInvalidTimeout;
        return FinishWithoutData();
      }
      numSamples = kAllSamples;
    }
    samples_ = numSamples;
    count_ = WaveformCount(waveforms_);
    // The scratch record is part of the test: a single-point or XY read of the session may have
    // set the shared counts without making it.
    const bool cached = slot_.cachedSamples == samples_ && slot_.cachedCount == count_ &&
                        slot_.waveformScratch != nullptr;
    if (!cached) {
      switch (Rebuild()) {
        case eNext::kWithoutData:
          return FinishWithoutData();
        case eNext::kWithData:
          return FinishWithData();
        case eNext::kRead:
          break;
      }
    }
    tWaveformScratch &scratch = *slot_.waveformScratch;
    if (LockWaveforms(waveforms_, kLockToFill, count_, scratch.descriptors) != 0) {
      status_ = kvErrOutputMemory;
      return FinishWithData();
    }
    // The cache knows the array it sized last, not the one passed now: a waveform shorter than the
    // read would be filled past its end, so such an array is sized again first.
    if (!HoldsSamples(scratch.descriptors)) {
      UnlockWaveforms(waveforms_, count_, scratch.descriptors);
      if (ResizeWaveforms(waveforms_, count_, samples_) != 0) {
        status_ = kvErrOutputMemory;
        return FinishWithoutData();
      }
      if (LockWaveforms(waveforms_, kLockToFill, count_, scratch.descriptors) != 0) {
        status_ = kvErrOutputMemory;
        return FinishWithData();
      }
    }
    for (int32_t i = 0; i < count_; ++i) scratch.sampleBuffers[i] = scratch.descriptors[i].samples;
    RegisterAbortIfBlocking(session_, timeout_);
    status_ = kvhdnReadSignalWaveform(session_, timeout_, &rawStart_, &dt_, scratch.sampleBuffers,
                                      static_cast<uint32_t>(samples_) * 8u, &actual_);
    return FinishWithData();
  }

 private:
  enum class eNext { kRead, kWithData, kWithoutData };

  // Sizes the array and the scratch for the session's signals and the samples asked for.
  eNext Rebuild() {
    slot_.cachedSamples = samples_;
    status_ = kvGetProperty(session_, kvPropSession_NumInList, 4, &count_);
    if (status_ < 0) return eNext::kWithoutData;
    if (ResizeWaveforms(waveforms_, count_, samples_) != 0) {
      count_ = kUnknown;
      slot_.cachedCount = kUnknown;
      status_ = kvErrOutputMemory;
      return eNext::kWithoutData;
    }
    slot_.cachedCount = count_;
    const eScratchBuilt built = BuildWaveformScratch(slot_, count_);
    if (built == eScratchBuilt::kDone) return eNext::kRead;
    slot_.cachedCount = kUnknown;
    slot_.cachedSamples = kUnknown;
    status_ = kvErrOutputMemory;
    // Without descriptors there is nothing to stamp: the array is emptied instead.
    if (built == eScratchBuilt::kNoRecord || slot_.waveformScratch->descriptors == nullptr) {
      return eNext::kWithoutData;
    }
    return eNext::kWithData;
  }

  bool HoldsSamples(const SvWaveformDescriptor *descriptors) const {
    for (int32_t i = 0; i < count_; ++i)
      if (descriptors[i].numSamples < static_cast<uint32_t>(samples_)) return false;
    return true;
  }

  // The array is still locked here when the Lock succeeded.
  Status FinishWithData() {
    if (count_ <= 0) return FinishWithoutData();
    if (actual_ != static_cast<uint32_t>(samples_)) {
      if (ResizeWaveforms(waveforms_, count_, static_cast<int32_t>(actual_)) != 0) {
        status_ = ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, kLineCutFailed, 0);
      }
      slot_.cachedSamples = kUnknown;
    }
    SvWaveformDescriptor *descriptors = slot_.waveformScratch->descriptors;
    SvTime t0;
    RawTimeToSvTime(&t0, &rawStart_);
    for (int32_t i = 0; i < count_; ++i) {
      descriptors[i].dt = dt_;
      descriptors[i].t0 = t0;
    }
    if (UnlockWaveforms(waveforms_, count_, descriptors) != 0) {
      const Status reported =
          ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, kLineUnlockFailed, 0);
      if (reported != 0 && status_ >= 0) status_ = reported;
    }
    return Finish();
  }

  Status FinishWithoutData() {
    ResizeWaveforms(waveforms_, 0, 0);
    slot_.cachedSamples = kUnknown;
    return Finish();
  }

  Status Finish() {
    if (status_ < 0) slot_.cachedSamples = kUnknown;
    return status_;
  }

  tSessionSlot &slot_;
  const uint32_t session_;
  SvWaveformArray &waveforms_;
  const double timeout_;
  Status status_ = 0;
  int32_t samples_ = 0;
  int32_t count_ = 0;
  uint32_t actual_ = 0;
  double dt_ = 0.0;
  uint64_t rawStart_ = 0;
};

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadSignalWaveform(uint32_t session, int32_t numSamples,
                                                         SvWaveformArray *waveforms,
                                                         double timeout) {
  if (waveforms == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  return cWaveformRead(guard.slot(), session, *waveforms, timeout).Run(numSamples);
}
