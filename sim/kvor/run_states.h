// Which sessions and which interfaces are started. kvStart and kvStop change them by scope (see
// kvsim.h). An interface, once started, runs until a stop of its own, or until the last started
// session on it ends with a normal stop or a clear.
#ifndef KVOR_SIM_RUN_STATES_H
#define KVOR_SIM_RUN_STATES_H

#include <array>
#include <cstdint>
#include <mutex>
#include <unordered_map>

#include "driver_status.h"
#include "inventory.h"
#include "session.h"

namespace nKvorSim {

class RunStates {
 public:
  // `handle` is the open session `session`. A session cleared meanwhile is not started.
  Status Start(uint32_t handle, const Session &session, uint32_t scope);
  Status Stop(uint32_t handle, const Session &session, uint32_t scope);
  // The session of `handle` has been cleared: it stops as with a normal stop.
  void Forget(uint32_t handle);

  bool SessionStarted(uint32_t handle) const;
  bool InterfaceStarted(uint32_t interfaceIndex) const;

  void Reset();

 private:
  // Stops the session (if started) and, for a normal stop, its interface once no other started
  // session is on it. Needs mutex_.
  void StopLocked(uint32_t handle, uint32_t interfaceIndex, bool normal);

  mutable std::mutex mutex_;
  std::unordered_map<uint32_t, uint32_t> startedSessions_;  // handle -> its interface index
  std::array<bool, kInterfaceCount> interfaceStarted_{};
};

}  // namespace nKvorSim

#endif
