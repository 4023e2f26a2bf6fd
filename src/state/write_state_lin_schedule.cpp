// kvsvWriteStateLINScheduleChange: selects a LIN session's schedule, named by number or by name.
#include <new>

#include "kvorproperties.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "property/property_name_list.h"
#include "property/session_name_to_index.h"
#include "session/name_list.h"
#include "session/session_manager.h"
#include "session/slot_guard.h"

using namespace nKVSVAPI100;

namespace {

// One common exit serves every end of the name lookup, the lost race included: a caller that
// found the list guard held clears it all the same, and so frees the guard of the lookup that
// holds it. The exit is kept as it has always behaved.
void LeaveListGuard(uint32_t session) {
  tSessionSlot *slot = gSessionManager.slots[SlotIndex(session)].load();
  if (slot != nullptr && slot->listGuard.load() != 0) slot->listGuard.exchange(0);
}

// The schedule's position among the session's schedule names, which are read once per slot. The
// index is set even when the name is not there.
Status FindSchedule(uint32_t session, const SvStr &name, int32_t &index) {
  Status status = 0;
  {
    // The list guard, not the call guard: a lookup may run beside a blocking frame call.
    cSlotGuard guard(session, &tSessionSlot::listGuard);
    status = guard.status();
    if (guard) {
      cNameList *&names = guard.slot().nameList;
      status = EnsurePropertyNameList(session, kvPropSession_IntfLINSchedNames, names);
      if (status >= 0) {
        index = names->Find(reinterpret_cast<const char *>(name.str), name.cnt);
        if (index < 0) status = kvErrScheduleNameUnknown;
      }
    }
  }
  if (status == kvErrSessionBusy) LeaveListGuard(session);
  return status;
}

Status ScheduleIndex(uint32_t session, const SvHandle *schedule, int32_t &index) {
  index = 0;
  // No text selects schedule 0.
  if (schedule == nullptr || *schedule == nullptr || **schedule == nullptr) return 0;
  const SvStr &name = *static_cast<const SvStr *>(**schedule);
  if (name.cnt <= 0) return 0;
  // A number needs neither the slot nor the names: it works even on a session without a slot.
  if (name.str[0] >= '0' && name.str[0] <= '9') {
    index = ParseDecimalString(name);
    return index < 0 ? kvErrScheduleNumberInvalid : 0;
  }
  try {
    return FindSchedule(session, name, index);
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteStateLINScheduleChange(uint32_t session,
                                                                  SvHandle *schedule) {
  int32_t index = 0;
  const Status status = ScheduleIndex(session, schedule, index);
  if (status < 0) return status;
  // No guard is held here: the driver orders schedule changes that meet.
  return kvWriteState(session, kvState_LINScheduleChange, sizeof index, &index);
}
