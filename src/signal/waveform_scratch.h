// The slot's waveform scratch: one sample address and one descriptor per signal, made again
// whenever the number of signals or samples changes, and freed with the slot.
#ifndef KVSVAPI_SIGNAL_WAVEFORM_SCRATCH_H
#define KVSVAPI_SIGNAL_WAVEFORM_SCRATCH_H

#include <cstdint>

#include "session/session_slot.h"

namespace nKVSVAPI100 {

enum class eScratchBuilt {
  kDone,
  kNoRecord,  // the slot has no scratch record
  kNoArrays   // the record is there, but one of its arrays or both are null
};

// Makes the slot's record if it has none, else frees its arrays, then makes both arrays for
// `count` signals.
eScratchBuilt BuildWaveformScratch(tSessionSlot &slot, int32_t count);

}  // namespace nKVSVAPI100

#endif
