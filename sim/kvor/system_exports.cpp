// The system object: kvSystemOpen, kvSystemClose.
#include <memory>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"
#include "system_handles.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvSystemOpen(uint32_t *system) {
  CallArgs args;
  args.function = "kvSystemOpen";
  return RunDriverCall(args, 0, [&](CallArgs &call) -> Status {
    if (system == nullptr) return kvsimErrNullPointer;
    uint32_t handle = 0;
    const Status status = Driver::Instance().Systems().Open(&handle);
    if (status < 0) return status;
    *system = handle;
    call.object = handle;
    return 0;
  });
}

// A caller that got an error session in place of a system closes it here; that ends the error
// session as kvClear would.
KVOR_DRIVER_API int32_t kvSystemClose(uint32_t system) {
  CallArgs args;
  args.function = "kvSystemClose";
  args.object = system;
  return RunDriverCall(args, system, [&](CallArgs &) -> Status {
    Driver &driver = Driver::Instance();
    if (IsSystemClassHandle(system)) return driver.Systems().Close(system);
    const std::shared_ptr<Session> session = driver.Sessions().Find(system);
    if (!session || session->ErrorStatus() == 0) return kvsimErrInvalidObject;
    return driver.ClearSession(system);
  });
}
