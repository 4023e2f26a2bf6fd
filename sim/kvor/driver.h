// The driver: the one object of the process that owns every part of the stand-in.
#ifndef KVOR_SIM_DRIVER_H
#define KVOR_SIM_DRIVER_H

#include <cstdint>
#include <memory>

#include "blink_modes.h"
#include "call_counter.h"
#include "call_holds.h"
#include "call_log.h"
#include "database_registry.h"
#include "driver_status.h"
#include "failure_plan.h"
#include "frame_bus.h"
#include "network.h"
#include "run_states.h"
#include "session_registry.h"
#include "system_registry.h"
#include "virtual_clock.h"

namespace nKvorSim {

class Driver {
 public:
  static Driver &Instance();

  CallLog &Log() { return log_; }
  FailurePlan &Failures() { return failures_; }
  CallHolds &Holds() { return holds_; }
  CallCounter &Blocked() { return blocked_; }
  VirtualClock &Clock() { return clock_; }
  NetworkSet &Networks() { return networks_; }
  FrameBus &Bus() { return bus_; }
  SessionRegistry &Sessions() { return sessions_; }
  SystemRegistry &Systems() { return systems_; }
  RunStates &Running() { return running_; }
  BlinkModes &Blinking() { return blinking_; }
  DatabaseRegistry &Databases() { return databases_; }

  // The open session of `handle` in *session, or the status with which a use of the handle
  // fails: invalid for a handle that is not open, the error status of an error session.
  Status UseSession(uint32_t handle, std::shared_ptr<Session> *session);
  // The status of the error session of `handle`; 0 if `handle` is not an error session. Calls on
  // other kinds of object answer an error handle with its failure, as calls on sessions do.
  Status ErrorSessionStatus(uint32_t handle) const;
  // Ends a session or error session and wakes every call blocked on it.
  Status ClearSession(uint32_t handle);

  void Reset();

 private:
  Driver() = default;

  CallLog log_;
  FailurePlan failures_;
  CallHolds holds_;
  CallCounter blocked_;
  VirtualClock clock_;
  NetworkSet networks_;
  FrameBus bus_;
  SessionRegistry sessions_;
  SystemRegistry systems_;
  RunStates running_;
  BlinkModes blinking_;
  DatabaseRegistry databases_;
};

}  // namespace nKvorSim

#endif
