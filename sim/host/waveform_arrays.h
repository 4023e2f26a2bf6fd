// The host's waveform arrays, made for tests through svsim.h: what a reset of the stand-in puts
// back. Live arrays stay, as live handles do.
#ifndef SVHOST_WAVEFORM_ARRAYS_H
#define SVHOST_WAVEFORM_ARRAYS_H

namespace svhost {

// Forgets the count of unlocks that had no lock.
void ResetWaveformArrays();

}  // namespace svhost

#endif
