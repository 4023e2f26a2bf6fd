// The open sessions by handle. A handle is 0x20GGIIII: IIII, from 1 to 8192, is unique among open
// sessions, so that a caller may index a table by it; GG counts how often IIII was handed out, so
// that the handle of a cleared session stays invalid when IIII serves again.
#ifndef KVOR_SIM_SESSION_REGISTRY_H
#define KVOR_SIM_SESSION_REGISTRY_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <mutex>
#include <unordered_map>
#include <vector>

#include "driver_status.h"
#include "session.h"

namespace nKvorSim {

class SessionRegistry {
 public:
  static constexpr uint32_t kMaxSessions = 8192;

  Status Add(std::shared_ptr<Session> session, uint32_t *handle);
  std::shared_ptr<Session> Find(uint32_t handle) const;
  // Takes the session out of the registry; the caller wakes what waits on it.
  std::shared_ptr<Session> Remove(uint32_t handle);
  std::vector<std::shared_ptr<Session>> RemoveAll();
  // The open sessions at this moment, error sessions included.
  std::vector<std::shared_ptr<Session>> All() const;
  size_t Count() const;

 private:
  static constexpr uint32_t kTag = 0x20000000u;

  mutable std::mutex mutex_;
  std::unordered_map<uint32_t, std::shared_ptr<Session>> sessions_;
  std::array<bool, kMaxSessions + 1> inUse_{};          // by index; index 0 is never used
  std::array<uint8_t, kMaxSessions + 1> generation_{};  // by index
  uint32_t lastIndex_ = 0;
};

}  // namespace nKvorSim

#endif
