// Evenly spaced samples of every signal of a session, one sample buffer per signal.
//
// An input waveform session (mode 1) resamples what reaches it at kvPropSession_ResampRate
// samples per second, on a grid of instants that starts when the session is made (or flushed):
// the sample at an instant is the latest value stamped no later than it (0.0 before any). A read
// hands out the instants that the clock has reached and no read has taken, at most as many as a
// buffer holds. With a time limit of 0 it takes what is there; with any other (seconds, negative
// for none) it first waits until the clock has reached enough instants to fill the buffers, and
// takes what is there when the limit runs out. A clear of the session ends the wait.
//
// An output waveform session (mode 4) sends sample k of every signal at instant k of its own
// grid, at kvPropSession_ResampRate: a write starts where the one before it ended, or at the clock
// if that has passed, and each instant's values go out in one frame per frame group.
#ifndef KVOR_SIM_SIGNAL_WAVEFORM_H
#define KVOR_SIM_SIGNAL_WAVEFORM_H

#include <cstdint>

#include "driver.h"
#include "driver_status.h"
#include "session.h"

namespace nKvorSim {

struct tWaveformRead {
  uint64_t *startTime;
  double *interval;
  double *const *buffers;
  uint32_t bufferSize;
  uint32_t *numSamples;
};

Status ReadSignalWaveform(Driver &driver, Session &session, double timeout,
                          const tWaveformRead &read);

Status WriteSignalWaveform(Driver &driver, Session &session, double timeout,
                           const double *const *buffers, uint32_t bufferSize);

}  // namespace nKvorSim

#endif
