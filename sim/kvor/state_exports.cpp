// State writes: kvWriteState. The one state known here selects the LIN schedule of a session on
// a LIN interface.
#include <cstring>
#include <memory>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "inventory.h"
#include "kvsim.h"
#include "kvsvplatform.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvWriteState(uint32_t session, uint32_t stateId, uint32_t size,
                                     const void *value) {
  CallArgs args;
  args.function = "kvWriteState";
  args.object = session;
  args.propertyId = stateId;
  args.size1 = size;
  return RunDriverCall(args, session, [&](CallArgs &) -> Status {
    std::shared_ptr<Session> target;
    const Status status = Driver::Instance().UseSession(session, &target);
    if (status != 0) return status;
    if (stateId != kvState_LINScheduleChange) return kvsimErrUnknownState;
    if (value == nullptr) return kvsimErrNullPointer;
    if (size != sizeof(uint32_t)) return kvsimErrInvalidArgument;
    if (target->Definition().protocol != kProtocolLin) return kvsimErrWrongProtocol;
    uint32_t index = 0;
    std::memcpy(&index, value, sizeof index);
    target->SelectLinSchedule(index);
    return 0;
  });
}
