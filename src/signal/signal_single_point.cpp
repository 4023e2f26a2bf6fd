// kvsvReadSignalSinglePoint and kvsvWriteSignalSinglePoint: the latest value of each signal.
#include "core/host_handles.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/slot_guard.h"
#include "signal/value_array.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvReadSignalSinglePoint(uint32_t session, SvHandle *values) {
  if (values == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  Status status = PrepareValueArray(slot, session, values);
  if (status < 0) return status;
  // The driver fills the host array in place, behind its header: no copy.
  const uint32_t count = static_cast<uint32_t>(slot.cachedCount);
  status = kvReadSignalSinglePoint(session, ArrayData8<double>(*values), count * 8u, nullptr, 0);
  ArrayCount(*values) = status < 0 ? 0 : slot.cachedCount;
  return status;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteSignalSinglePoint(uint32_t session, SvHandle values) {
  // No guard and no slot: the driver judges the session.
  if (values == nullptr || *values == nullptr) return kvWriteSignalSinglePoint(session, nullptr, 0);
  const int32_t count = ArrayCount(values);
  const uint32_t bytes = count > 0 ? static_cast<uint32_t>(count) * 8u : 0u;
  return kvWriteSignalSinglePoint(session, ArrayData8<double>(values), bytes);
}
