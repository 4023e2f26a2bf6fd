// kvsvReadSignalXY and kvsvReadSignalXYEx: value and time pairs of every signal, from the driver's
// flat regions in the slot's scratch area into the host's clusters of two arrays.
#include <algorithm>
#include <cstring>

#include "core/host_handles.h"
#include "core/timestamps.h"
#include "frame/ex_skip.h"
#include "frame/frame_buffer.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"
#include "signal/value_array.h"
#include "signal/xy_clusters.h"

using namespace nKVSVAPI100;

namespace {

class cXYRead {
 public:
  cXYRead(tSessionSlot &slot, uint32_t session, SvHandle *clusters)
      : slot_(slot), session_(session), clusters_(clusters) {}

  Status Run(int32_t numSamples, const SvTime *timeLimit) {
    samples_ = numSamples < 0 ? QueueSamples() : numSamples;
    // A count put back to unknown by another call of the session sends this one back as well.
    const bool cached = slot_.cachedSamples == samples_ && slot_.cachedCount != kUnknown &&
                        *clusters_ != nullptr &&
                        svGetHandleSize(*clusters_) >= slot_.requiredHandleSize;
    if (!cached) Rebuild();
    FitElements();
    // A limit whose seconds are 0 is no limit, whatever its fraction says.
    uint64_t rawLimit = 0;
    const bool limited = timeLimit != nullptr && timeLimit->seconds != 0;
    if (limited) SvTimeToRawTime(&rawLimit, timeLimit);
    if (status_ < 0) return FailWithoutData();
    const tXYRegions regions(slot_.frameBuffer, Count(), Run());
    const uint32_t stride = ReadRegions(regions, limited ? &rawLimit : nullptr);
    Publish(regions, stride);
    if (status_ < 0) slot_.cachedSamples = kUnknown;
    return status_;
  }

 private:
  // The session's queue size, read once for the life of the slot.
  int32_t QueueSamples() {
    if ((slot_.cacheFlags & kLimitsKnown) == 0) {
      status_ = kvGetProperty(session_, kvPropSession_QueueSize, 4, &slot_.frameLimit);
      if (status_ >= 0) slot_.cacheFlags |= kLimitsKnown;
    }
    return static_cast<int32_t>(slot_.frameLimit);
  }

  void Rebuild() {
    status_ = kvGetProperty(session_, kvPropSession_NumInList, 4, &slot_.cachedCount);
    if (status_ < 0) {
      slot_.cachedCount = kUnknown;
    } else {
      status_ = kvGetProperty(session_, kvPropSession_Mode, 4, &slot_.sessionMode);
    }
    if (status_ >= 0) {
      slot_.requiredHandleSize = ClusterArrayBytes(static_cast<uint32_t>(slot_.cachedCount));
      status_ = RemapOutputStatus(ResizeOrCreateHandle(clusters_, slot_.requiredHandleSize));
    }
    // Only here, after the cache test: a caller that passes 0 then rebuilds on every call, since
    // the cache holds 1. Every mode but XY answers with one sample, so it needs room for one.
    if (samples_ == 0 && slot_.sessionMode != kvMode_SignalInXY) samples_ = 1;
    if (status_ < 0) return;
    slot_.cachedSamples = samples_;
    status_ = GrowFrameBuffer(slot_, tXYRegions::AreaBytes(Count(), Run()));
  }

  // Every call, the fast path too: the host program may have disposed of an element.
  void FitElements() {
    if (status_ < 0) return;
    tXYCluster *clusters = Clusters(*clusters_);
    for (int32_t i = 0; i < slot_.cachedCount && status_ >= 0; ++i) {
      status_ = FitSignalArray(&clusters[i].values, ValueArrayBytes(Run()));
      if (status_ >= 0)
        status_ = FitSignalArray(&clusters[i].timestamps, TimestampArrayBytes(Run()));
    }
  }

  Status FailWithoutData() {
    const size_t size = *clusters_ != nullptr ? svGetHandleSize(*clusters_) : 0;
    if (*clusters_ != nullptr && **clusters_ != nullptr && size >= kArrayHeaderBytes) {
      // Only clusters that the handle holds: a failed growth leaves it shorter than the count.
      const size_t held = (size - kArrayHeaderBytes) / sizeof(tXYCluster);
      const int32_t disposed =
          std::min<int64_t>(std::max<int32_t>(slot_.cachedCount, 0), static_cast<int64_t>(held));
      tXYCluster *clusters = Clusters(*clusters_);
      for (int32_t i = 0; i < disposed; ++i) {
        DisposeHandle(&clusters[i].timestamps);
        DisposeHandle(&clusters[i].values);
      }
      ArrayCount(*clusters_) = 0;
    }
    slot_.cachedSamples = kUnknown;
    return status_;
  }

  // Gives the distance between the runs of two signals in the regions.
  uint32_t ReadRegions(const tXYRegions &regions, const uint64_t *rawLimit) {
    if (slot_.sessionMode == kvMode_SignalInXY) {
      if (rawLimit != nullptr) RegisterAbort(session_);
      status_ = kvReadSignalXY(session_, rawLimit, regions.values, regions.total,
                               regions.timestamps, regions.total, regions.numPairs, Count() * 4u);
      return Run();
    }
    // Any other mode answers with the latest value of each signal and its time, side by side.
    const uint32_t per = Count() * 8u;
    status_ = kvReadSignalSinglePoint(session_, regions.values, per, regions.timestamps, per);
    std::fill(regions.numPairs, regions.numPairs + Count(), 1u);
    return 1;
  }

  // Whatever the driver said: after a failure the arrays show what its regions hold.
  void Publish(const tXYRegions &regions, uint32_t stride) {
    ArrayCount(*clusters_) = slot_.cachedCount;
    tXYCluster *clusters = Clusters(*clusters_);
    for (uint32_t i = 0; i < Count(); ++i) {
      // The elements hold a whole run; a count beyond it is none the driver could have written.
      const uint32_t pairs = std::min(regions.numPairs[i], Run());
      const uint64_t offset = uint64_t{i} * stride;
      ArrayCount(clusters[i].values) = static_cast<int32_t>(pairs);
      std::memcpy(ArrayData8<double>(clusters[i].values), regions.values + offset,
                  pairs * sizeof(double));
      ArrayCount(clusters[i].timestamps) = static_cast<int32_t>(pairs);
      SvTime *times = ArrayData8<SvTime>(clusters[i].timestamps);
      for (uint32_t k = 0; k < pairs; ++k)
        RawTimeToSvTime(&times[k], &regions.timestamps[offset + k]);
    }
  }

  uint32_t Count() const { return static_cast<uint32_t>(slot_.cachedCount); }
  uint32_t Run() const { return static_cast<uint32_t>(samples_); }

  static constexpr size_t kArrayHeaderBytes = 8;

  tSessionSlot &slot_;
  const uint32_t session_;
  SvHandle *const clusters_;
  Status status_ = 0;
  int32_t samples_ = 0;
};

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadSignalXY(uint32_t session, int32_t numSamples,
                                                   const SvTime *timeLimit, SvHandle *clusters) {
  if (clusters == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  return cXYRead(guard.slot(), session, clusters).Run(numSamples, timeLimit);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadSignalXYEx(uint32_t session, int32_t numSamples,
                                                     const SvTime *timeLimit, SvHandle *clusters,
                                                     const uint8_t *skip) {
  if (SkipRequested(skip)) return 0;
  return kvsvReadSignalXY(session, numSamples, timeLimit, clusters);
}
