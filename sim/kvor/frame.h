// A frame as it travels on a virtual network, whatever the record form of the sessions that send
// and receive it.
#ifndef KVOR_SIM_FRAME_H
#define KVOR_SIM_FRAME_H

#include <cstdint>
#include <vector>

namespace nKvorSim {

struct Frame {
  uint64_t timestamp = 0;  // arrival, rawTime
  uint64_t sentAt = 0;     // transmission, rawTime
  uint32_t identifier = 0;
  uint32_t sequence = 0;  // Ethernet: the frame's number on its network
  uint8_t type = 0;
  uint8_t flags = 0;
  uint8_t info = 0;
  std::vector<uint8_t> payload;
};

}  // namespace nKvorSim

#endif
