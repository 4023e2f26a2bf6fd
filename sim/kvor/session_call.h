// The path of a driver call that works on one session: logged, holdable and failable as every
// call, then the session looked up, with an error session answering its own status.
#ifndef KVOR_SIM_SESSION_CALL_H
#define KVOR_SIM_SESSION_CALL_H

#include <cstdint>
#include <memory>
#include <type_traits>

#include "driver.h"
#include "driver_call.h"

namespace nKvorSim {

inline CallArgs SessionCallArgs(const char *function, uint32_t session, uint32_t size1,
                                uint32_t size2 = 0) {
  CallArgs args;
  args.function = function;
  args.object = session;
  args.size1 = size1;
  args.size2 = size2;
  return args;
}

// `body` takes the driver and the session, and the call's record if it wants it.
template <class Body>
Status RunSessionCall(const CallArgs &args, uint32_t handle, Body &&body) {
  return RunDriverCall(args, handle, [&](CallArgs &call) -> Status {
    Driver &driver = Driver::Instance();
    std::shared_ptr<Session> session;
    const Status status = driver.UseSession(handle, &session);
    if (status != 0) return status;
    if constexpr (std::is_invocable_v<Body, Driver &, Session &, const CallArgs &>) {
      return body(driver, *session, call);
    } else {
      return body(driver, *session);
    }
  });
}

}  // namespace nKvorSim

#endif
