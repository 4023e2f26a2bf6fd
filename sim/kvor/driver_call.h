// The path of every driver call: recorded in the call log, parked while its function is held,
// replaced or amended by an injected status, and with no exception let out to the caller.
#ifndef KVOR_SIM_DRIVER_CALL_H
#define KVOR_SIM_DRIVER_CALL_H

#include <cstdint>
#include <new>
#include <optional>
#include <utility>

#include "call_log.h"
#include "driver_status.h"
#include "kvsim.h"

namespace nKvorSim {

class DriverCall {
 public:
  // `session` is the session whose clearing ends a parked call; 0 for none.
  DriverCall(CallArgs args, uint32_t session);

  // Parks while the function is held and looks for an injected status. 0 means the call does its
  // work; anything else is the call's result.
  Status Begin();
  // What the log will show; a call that makes a handle puts it in `object`.
  CallArgs &Args() { return args_; }
  // Records the result, with an injected warning in place of a plain success.
  Status End(Status result);

 private:
  CallArgs args_;
  uint32_t session_;
  uint64_t sequence_;
  std::optional<Status> warning_;
};

template <class Body>
Status RunDriverCall(CallArgs args, uint32_t session, Body &&body) {
  try {
    DriverCall call(std::move(args), session);
    Status status = call.Begin();
    if (status == 0) {
      try {
        status = body(call.Args());
      } catch (const std::bad_alloc &) {
        status = kvsimErrOutOfMemory;
      } catch (...) {
        status = kvsimErrInternal;
      }
    }
    return call.End(status);
  } catch (const std::bad_alloc &) {
    return kvsimErrOutOfMemory;
  } catch (...) {
    return kvsimErrInternal;
  }
}

}  // namespace nKvorSim

#endif
