// Carries frames from a writing session to the frame input sessions of its network. A frame
// arrives at every input session on the other interfaces of the network. On the writer's own
// interface it arrives as an echo, with the echo flag set, when the writer has echo enabled; an
// interface alone on its network hears every frame it sends, with the echo flag set only when the
// writer has echo enabled.
#ifndef KVOR_SIM_FRAME_BUS_H
#define KVOR_SIM_FRAME_BUS_H

#include <array>
#include <atomic>
#include <cstdint>
#include <vector>

#include "frame.h"
#include "inventory.h"
#include "session.h"
#include "session_registry.h"

namespace nKvorSim {

// Whether frames on the session's network reach it: frame input sessions, and signal input
// sessions made with a database, which decode them.
bool ReceivesFrames(const Session &session);

// Puts `frame` into an input session as received: at the end of its queue, or as the latest frame
// of each list item that names it; a signal session takes the values of its signals.
void ReceiveFrame(Session &receiver, const Frame &frame);

class FrameBus {
 public:
  // Sends `frames` from `writer` at `now`: each is stamped with `now` as its arrival and its
  // transmission, and numbered on its network.
  void Transmit(const Session &writer, std::vector<Frame> frames, uint64_t now,
                const SessionRegistry &sessions);
  // Sends `frames` from `writer` at once, each stamped with the time it is due at, as its arrival
  // and its transmission: signal writes that are scheduled reach their receivers ahead of time,
  // and the receivers let the clock reach them.
  void TransmitStamped(const Session &writer, std::vector<Frame> frames,
                       const SessionRegistry &sessions);
  // Numbering starts again from 1.
  void Reset();

 private:
  std::array<std::atomic<uint32_t>, kNetworkCount> sequences_{};
};

}  // namespace nKvorSim

#endif
