// State reads: kvReadState gives what a test set for the session (zeros and fault 0 for a state
// never set), kvReadStateTimeTrigger waits for the session's time trigger to fire on the clock.
#include <algorithm>
#include <cstring>
#include <optional>

#include "driver.h"
#include "driver_export.h"
#include "kvsim.h"
#include "kvsvplatform.h"
#include "session_call.h"
#include "session_states.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvReadState(uint32_t session, uint32_t stateId, uint32_t size, void *value,
                                    uint32_t *fault) {
  CallArgs args = SessionCallArgs("kvReadState", session, size);
  args.propertyId = stateId;
  return RunSessionCall(args, session, [&](Driver &, Session &target) -> Status {
    const Status status = CheckStateRead(target.Definition().protocol, stateId, size);
    if (status != 0) return status;
    if (value == nullptr) return kvsimErrNullPointer;
    const std::optional<StateValue> stored = target.States().Get(stateId);
    std::memset(value, 0, size);
    if (stored) std::memcpy(value, stored->bytes.data(), size);
    if (fault != nullptr) *fault = stored ? stored->fault : 0;
    return 0;
  });
}

KVOR_DRIVER_API int32_t kvReadStateTimeTrigger(uint32_t session, uint32_t size, void *value,
                                               double timeout) {
  const CallArgs args = SessionCallArgs("kvReadStateTimeTrigger", session, size);
  return RunSessionCall(args, session, [&](Driver &driver, Session &target) -> Status {
    if (value == nullptr) return kvsimErrNullPointer;
    if (size != kTimeRecordSize) return kvsimErrInvalidArgument;
    std::optional<TimeTrigger> fired;
    auto ready = [&] {
      const std::optional<TimeTrigger> trigger = target.States().Trigger();
      if (trigger && driver.Clock().Now() >= trigger->firesAt) fired = trigger;
      return fired.has_value();
    };
    const Status waited =
        target.Events().WaitUntil(ready, timeout, driver.Blocked(), "kvReadStateTimeTrigger");
    if (waited != 0) return waited;
    if (!fired) return kvsimErrTimeout;
    std::copy(fired->record.begin(), fired->record.end(), static_cast<uint8_t *>(value));
    return 0;
  });
}
