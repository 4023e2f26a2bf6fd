// Session control: kvStart, kvStop, kvFlush, kvConnectTerminals, kvDisconnectTerminals and
// kvhdnCreateSvTiming_FlexRayMacrotick.
#include <cstdio>
#include <memory>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "inventory.h"
#include "kvsvplatform.h"
#include "terminals.h"

using namespace nKvorSim;

namespace {

CallArgs SessionCall(const char *function, uint32_t session, uint32_t size1 = 0) {
  CallArgs args;
  args.function = function;
  args.object = session;
  args.size1 = size1;
  return args;
}

// A route is logged as "source -> destination"; a missing name shows as empty.
CallArgs RouteCall(const char *function, uint32_t session, const char *source,
                   const char *destination) {
  CallArgs args = SessionCall(function, session);
  std::snprintf(args.text, sizeof args.text, "%s -> %s", source != nullptr ? source : "",
                destination != nullptr ? destination : "");
  return args;
}

// A driver call whose `body` works on the open session of `handle`; an error session answers
// with its status.
template <class Body>
Status RunSessionCall(const CallArgs &args, uint32_t handle, Body &&body) {
  return RunDriverCall(args, handle, [&](CallArgs &) -> Status {
    std::shared_ptr<Session> session;
    const Status status = Driver::Instance().UseSession(handle, &session);
    if (status != 0) return status;
    return body(*session);
  });
}

}  // namespace

KVOR_DRIVER_API int32_t kvStart(uint32_t session, uint32_t scope) {
  return RunSessionCall(SessionCall("kvStart", session, scope), session, [&](Session &target) {
    return Driver::Instance().Running().Start(session, target, scope);
  });
}

KVOR_DRIVER_API int32_t kvStop(uint32_t session, uint32_t scope) {
  return RunSessionCall(SessionCall("kvStop", session, scope), session, [&](Session &target) {
    return Driver::Instance().Running().Stop(session, target, scope);
  });
}

// A flush drops the signal values and frames that arrived so far. An output session holds
// nothing, since what it writes is on the network at once.
KVOR_DRIVER_API int32_t kvFlush(uint32_t session) {
  return RunSessionCall(SessionCall("kvFlush", session), session, [&](Session &target) {
    target.MarkFlushed(target.Definition().network->LastPublication());
    target.Frames().Flush();
    target.SignalsIn().Flush(Driver::Instance().Clock().Now());
    return Status{0};
  });
}

KVOR_DRIVER_API int32_t kvConnectTerminals(uint32_t session, const char *source,
                                           const char *destination) {
  const CallArgs args = RouteCall("kvConnectTerminals", session, source, destination);
  return RunSessionCall(args, session, [&](Session &target) {
    const Status status = CheckRoute(source, destination);
    if (status < 0) return status;
    target.Terminals().Connect(source, destination);
    return Status{0};
  });
}

KVOR_DRIVER_API int32_t kvDisconnectTerminals(uint32_t session, const char *source,
                                              const char *destination) {
  const CallArgs args = RouteCall("kvDisconnectTerminals", session, source, destination);
  return RunSessionCall(args, session, [&](Session &target) {
    const Status status = CheckRoute(source, destination);
    if (status < 0) return status;
    return target.Terminals().Disconnect(source, destination) ? Status{0} : kvsimErrNotConnected;
  });
}

KVOR_DRIVER_API int32_t kvhdnCreateSvTiming_FlexRayMacrotick(uint32_t session,
                                                             uint64_t *timingSource) {
  const CallArgs args = SessionCall("kvhdnCreateSvTiming_FlexRayMacrotick", session);
  return RunSessionCall(args, session, [&](Session &target) -> Status {
    if (target.Definition().protocol != kProtocolFlexRay) return kvsimErrWrongProtocol;
    if (timingSource == nullptr) return kvsimErrNullPointer;
    *timingSource = KVSIM_MACROTICK_SOURCE(session);
    return 0;
  });
}
