// Interface control: kvBlink.
#include <optional>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "inventory.h"
#include "kvsvplatform.h"
#include "system_handles.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvBlink(uint32_t interfaceRef, uint32_t mode) {
  CallArgs args;
  args.function = "kvBlink";
  args.object = interfaceRef;
  args.size1 = mode;
  return RunDriverCall(args, 0, [&](CallArgs &) -> Status {
    Driver &driver = Driver::Instance();
    // An interface that failed to open is an error handle, which answers with its failure.
    if (const Status failure = driver.ErrorSessionStatus(interfaceRef)) return failure;
    const std::optional<SystemObject> object = driver.Systems().Resolve(interfaceRef);
    if (!object || object->kind != SystemObjectKind::kInterface) return kvsimErrInvalidObject;
    if (mode != kvsimBlinkOff && mode != kvsimBlinkOn) return kvsimErrInvalidArgument;
    driver.Blinking().Set(InterfaceIndexAt(object->device, object->port), mode);
    return 0;
  });
}
