// kvsvWriteSignalXY: value and time pairs of every signal, from the host's clusters of two arrays
// into the driver's flat regions in the slot's scratch area.
#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "core/host_handles.h"
#include "core/timestamps.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"
#include "signal/xy_clusters.h"

using namespace nKVSVAPI100;

namespace {

// Elements the host array holds; an element without a block counts as empty.
int32_t ElementCount(SvHandle array) {
  return array != nullptr && *array != nullptr ? ArrayCount(array) : 0;
}

// Replaces the scratch area by one for runs of `run` pairs whenever the cached run is shorter,
// even if the area would have held them. Out of memory is reported as such: this is no output.
Status SizeArea(tSessionSlot &slot, int32_t run) {
  const uint32_t bytes =
      tXYRegions::AreaBytes(static_cast<uint32_t>(slot.cachedCount), static_cast<uint32_t>(run));
  // The area's own size is tested too: another use of the slot may have set the cached run.
  if (slot.cachedSamples >= run && bytes <= slot.frameBufferSize) return 0;
  std::free(slot.frameBuffer);
  slot.frameBuffer = nullptr;
  slot.frameBufferSize = bytes;
  slot.frameBuffer = std::malloc(bytes == 0 ? 1 : bytes);
  if (slot.frameBuffer == nullptr) {
    slot.frameBufferSize = 0;
    return kvErrOutOfMemory;
  }
  slot.cachedSamples = run;
  return 0;
}

Status WritePairs(tSessionSlot &slot, uint32_t session, SvHandle clusters, double timeout) {
  if (slot.cachedCount == kUnknown) {
    const Status status = kvGetProperty(session, kvPropSession_NumInList, 4, &slot.cachedCount);
    if (status < 0) return status;
  }
  if (clusters == nullptr || *clusters == nullptr || ArrayCount(clusters) != slot.cachedCount) {
    return kvErrElementCountMismatch;
  }
  const tXYCluster *elements = Clusters(clusters);
  const uint32_t count = static_cast<uint32_t>(slot.cachedCount);
  int32_t maxValues = 0;
  bool haveTimes = false;
  for (uint32_t i = 0; i < count; ++i) {
    maxValues = std::max(maxValues, ElementCount(elements[i].values));
    haveTimes = haveTimes || ElementCount(elements[i].timestamps) != 0;
  }
  const Status status = SizeArea(slot, maxValues);
  if (status < 0) return status;
  const uint32_t run = static_cast<uint32_t>(maxValues);
  const tXYRegions regions(slot.frameBuffer, count, run);
  for (uint32_t i = 0; i < count; ++i) {
    int32_t pairs = ElementCount(elements[i].values);
    if (haveTimes) pairs = std::min(pairs, ElementCount(elements[i].timestamps));
    pairs = std::max(pairs, 0);
    regions.numPairs[i] = static_cast<uint32_t>(pairs);
    const uint64_t offset = uint64_t{i} * run;
    if (pairs == 0) continue;
    std::memcpy(regions.values + offset, ArrayData8<double>(elements[i].values),
                static_cast<size_t>(pairs) * sizeof(double));
    if (!haveTimes) continue;
    const SvTime *times = ArrayData8<SvTime>(elements[i].timestamps);
    for (int32_t k = 0; k < pairs; ++k) SvTimeToRawTime(&regions.timestamps[offset + k], &times[k]);
  }
  RegisterAbortIfBlocking(session, timeout);
  return kvWriteSignalXY(session, timeout, regions.values, regions.total,
                         haveTimes ? regions.timestamps : nullptr, haveTimes ? regions.total : 0,
                         regions.numPairs, count * 4u);
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteSignalXY(uint32_t session, SvHandle clusters,
                                                    double timeout) {
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  const Status status = WritePairs(slot, session, clusters, timeout);
  if (status < 0) slot.cachedCount = kUnknown;
  return status;
}
