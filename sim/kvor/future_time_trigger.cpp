// kvFutureTimeTrigger: arms an output session's trigger at a time that has not come yet.
#include <memory>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "frame_properties.h"
#include "inventory.h"
#include "kvsim.h"
#include "kvsvplatform.h"

using namespace nKvorSim;

namespace {

bool IsOutputMode(uint32_t mode) {
  return mode == kvMode_SignalOutSinglePoint || mode == kvMode_SignalOutWaveform ||
         mode == kvMode_SignalOutXY || IsFrameOutputMode(mode);
}

}  // namespace

KVOR_DRIVER_API int32_t kvFutureTimeTrigger(uint32_t session, uint64_t when, uint32_t option) {
  CallArgs args;
  args.function = "kvFutureTimeTrigger";
  args.object = session;
  args.size1 = option;
  return RunDriverCall(args, session, [&](CallArgs &) -> Status {
    std::shared_ptr<Session> target;
    const Status status = Driver::Instance().UseSession(session, &target);
    if (status != 0) return status;
    const SessionDefinition &definition = target->Definition();
    if (!IsOutputMode(definition.mode)) return kvsimErrWrongMode;
    // The time counts in the session's own units: 1 ns since 1970 on Ethernet.
    const uint64_t clock = Driver::Instance().Clock().Now();
    const uint64_t now = definition.protocol == kProtocolEthernet ? NsTime(clock) : clock;
    if (when < now) return kvsimErrTimeInPast;
    target->Trigger().Arm({when, option});
    return 0;
  });
}
