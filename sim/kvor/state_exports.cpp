// State writes: kvWriteState. The LIN schedule state selects the schedule of a session on a LIN
// interface; any other state is written only where a test declared it writable.
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
    const bool linSchedule = stateId == kvState_LINScheduleChange;
    if (!linSchedule && !target->StatesWritten().Allows(stateId)) return kvsimErrUnknownState;
    if (value == nullptr) return kvsimErrNullPointer;
    if (size != sizeof(uint32_t)) return kvsimErrInvalidArgument;
    uint32_t written = 0;
    std::memcpy(&written, value, sizeof written);
    if (!linSchedule) {
      target->StatesWritten().Write(stateId, written);
      return 0;
    }
    if (target->Definition().protocol != kProtocolLin) return kvsimErrWrongProtocol;
    target->SelectLinSchedule(written);
    return 0;
  });
}
