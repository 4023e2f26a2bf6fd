// Session life and waits: kvCreateSession, kvClear, kvhdnCreateErrorSession, kvWait.
#include <cstdio>
#include <memory>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"
#include "session_definition.h"
#include "signal_layout.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvCreateSession(const char *database, const char *cluster, const char *list,
                                        const char *interfaceName, uint32_t mode,
                                        uint32_t *session) {
  CallArgs args;
  args.function = "kvCreateSession";
  args.size1 = mode;
  if (interfaceName != nullptr) std::snprintf(args.text, sizeof args.text, "%s", interfaceName);
  return RunDriverCall(args, 0, [&](CallArgs &call) -> Status {
    if (session == nullptr) return kvsimErrNullPointer;
    Driver &driver = Driver::Instance();
    SessionDefinition definition;
    Status status = MakeSessionDefinition(database, cluster, list, interfaceName, mode,
                                          driver.Networks(), &definition);
    if (status < 0) return status;
    status = MakeSessionLayout(driver.Databases(), definition.database, definition.cluster,
                               definition.mode, definition.items, &definition.signals);
    if (status < 0) return status;
    definition.createdAt = driver.Clock().Now();
    uint32_t handle = 0;
    status = driver.Sessions().Add(std::make_shared<Session>(std::move(definition)), &handle);
    if (status < 0) return status;
    *session = handle;
    call.object = handle;
    return 0;
  });
}

KVOR_DRIVER_API int32_t kvClear(uint32_t session) {
  CallArgs args;
  args.function = "kvClear";
  args.object = session;
  return RunDriverCall(args, session, [&](CallArgs &) -> Status {
    return Driver::Instance().ClearSession(session);
  });
}

// An error session is ended by kvClear (or kvSystemClose), which returns 0: the failure it stands
// for has been reported at each use already.
KVOR_DRIVER_API int32_t kvhdnCreateErrorSession(int32_t status, uint32_t *session) {
  CallArgs args;
  args.function = "kvhdnCreateErrorSession";
  args.size1 = static_cast<uint32_t>(status);
  return RunDriverCall(args, 0, [&](CallArgs &call) -> Status {
    if (session == nullptr) return kvsimErrNullPointer;
    if (status >= 0) return kvsimErrInvalidArgument;
    uint32_t handle = 0;
    const Status added = Driver::Instance().Sessions().Add(
        std::make_shared<Session>(ErrorSessionTag{}, status), &handle);
    if (added < 0) return added;
    *session = handle;
    call.object = handle;
    return 0;
  });
}

KVOR_DRIVER_API int32_t kvWait(uint32_t session, uint32_t condition, uint32_t parameter,
                               uint32_t *parameterOut, double timeout) {
  CallArgs args;
  args.function = "kvWait";
  args.object = session;
  args.propertyId = condition;
  args.size1 = parameter;
  return RunDriverCall(args, session, [&](CallArgs &call) -> Status {
    Driver &driver = Driver::Instance();
    std::shared_ptr<Session> target;
    const Status status = driver.UseSession(session, &target);
    if (status != 0) return status;
    if (!IsWaitCondition(condition)) return kvsimErrInvalidCondition;
    return target->Events().WaitFor(condition, timeout, parameterOut, driver.Blocked(),
                                    call.function);
  });
}
