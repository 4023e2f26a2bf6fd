// The identification light of each interface: off (0) or blinking (1), as kvBlink last set it.
// It belongs to the hardware, so it outlives the system handle through which it was set.
#ifndef KVOR_SIM_BLINK_MODES_H
#define KVOR_SIM_BLINK_MODES_H

#include <array>
#include <atomic>
#include <cstdint>

#include "inventory.h"

namespace nKvorSim {

class BlinkModes {
 public:
  void Set(uint32_t interfaceIndex, uint32_t mode) { modes_[interfaceIndex].store(mode); }
  uint32_t Get(uint32_t interfaceIndex) const { return modes_[interfaceIndex].load(); }
  void Reset() {
    for (std::atomic<uint32_t> &mode : modes_) mode.store(0);
  }

 private:
  std::array<std::atomic<uint32_t>, kInterfaceCount> modes_{};
};

}  // namespace nKvorSim

#endif
