#include "signal/waveform_scratch.h"

#include <cstdlib>

namespace nKVSVAPI100 {

namespace {

// A session without signals still gets arrays, so that a null array always means failure.
void *Allocate(size_t bytes) { return std::malloc(bytes == 0 ? 1 : bytes); }

}  // namespace

eScratchBuilt BuildWaveformScratch(tSessionSlot &slot, int32_t count) {
  tWaveformScratch *scratch = slot.waveformScratch;
  if (scratch == nullptr) {
    scratch = static_cast<tWaveformScratch *>(std::malloc(sizeof(tWaveformScratch)));
    if (scratch == nullptr) return eScratchBuilt::kNoRecord;
    slot.waveformScratch = scratch;
  } else {
    std::free(scratch->descriptors);
    std::free(scratch->sampleBuffers);
  }
  const size_t signals = count > 0 ? static_cast<size_t>(count) : 0;
  scratch->descriptors =
      static_cast<SvWaveformDescriptor *>(Allocate(signals * sizeof(SvWaveformDescriptor)));
  scratch->sampleBuffers = static_cast<double **>(Allocate(signals * sizeof(double *)));
  if (scratch->descriptors == nullptr || scratch->sampleBuffers == nullptr) {
    return eScratchBuilt::kNoArrays;
  }
  return eScratchBuilt::kDone;
}

}  // namespace nKVSVAPI100
