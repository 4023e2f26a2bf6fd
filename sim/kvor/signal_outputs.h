// What a signal output session made with a database keeps between its writes: the payload of
// each frame group as the session last sent it, so that a frame carries the latest value of every
// signal of its group, and where its waveform output has reached. Safe for many threads.
#ifndef KVOR_SIM_SIGNAL_OUTPUTS_H
#define KVOR_SIM_SIGNAL_OUTPUTS_H

#include <cstdint>
#include <mutex>
#include <vector>

#include "frame.h"
#include "signal_layout.h"

namespace nKvorSim {

// One value of list item `index`, due at `time`.
struct tSignalEvent {
  uint64_t time = 0;
  uint32_t index = 0;
  double value = 0.0;
};

class SignalOutputs {
 public:
  // The frames that carry `events`, in time order: one frame per group and time, which carries
  // every value of the group due at that time, stamped with that time; a signal with two values
  // due at one time sends a frame for each, in their order.
  std::vector<Frame> Encode(const SignalLayout &layout, std::vector<tSignalEvent> events);

  // A waveform write starts where the one before ended, or now if that is past, and reaches up
  // to `end` (exclusive).
  uint64_t WaveformStart(uint64_t now);
  void WaveformReached(uint64_t end);

 private:
  std::mutex mutex_;
  std::vector<std::vector<uint8_t>> payloads_;  // by group; empty until the first write
  uint64_t waveformEnd_ = 0;
};

}  // namespace nKvorSim

#endif
