// The open systems. Each open makes a new system; its devices and interfaces answer while it is
// open, and their handles fail once it is closed.
#ifndef KVOR_SIM_SYSTEM_REGISTRY_H
#define KVOR_SIM_SYSTEM_REGISTRY_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <mutex>
#include <optional>

#include "driver_status.h"
#include "system_handles.h"

namespace nKvorSim {

class SystemRegistry {
 public:
  Status Open(uint32_t *handle);
  Status Close(uint32_t handle);
  void CloseAll();
  size_t OpenCount() const;

  // The object named by `handle` if its system is open.
  std::optional<SystemObject> Resolve(uint32_t handle) const;

 private:
  mutable std::mutex mutex_;
  std::array<bool, kMaxSystems + 1> open_{};  // index 0 unused
  uint32_t last_ = 0;                         // number of the latest open
};

}  // namespace nKvorSim

#endif
