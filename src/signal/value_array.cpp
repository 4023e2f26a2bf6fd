#include "signal/value_array.h"

#include "core/host_handles.h"

namespace nKVSVAPI100 {

Status PrepareValueArray(tSessionSlot &slot, uint32_t session, SvHandle *values) {
  if (slot.cachedCount != kUnknown && *values != nullptr &&
      svGetHandleSize(*values) >= slot.requiredHandleSize)
    return 0;
  Status status = kvGetProperty(session, kvPropSession_NumInList, 4, &slot.cachedCount);
  if (status < 0) {
    slot.cachedCount = kUnknown;
    ZeroArrayCount(*values);
    return status;
  }
  slot.requiredHandleSize = ValueArrayBytes(static_cast<uint32_t>(slot.cachedCount));
  // The count stays cached: only the size test sends the next call back here.
  status = RemapOutputStatus(ResizeOrCreateHandle(values, slot.requiredHandleSize));
  if (status < 0) ZeroArrayCount(*values);
  return status;
}

Status FitSignalArray(SvHandle *array, uint32_t bytes) {
  if (*array != nullptr && svGetHandleSize(*array) >= bytes) return 0;
  DisposeHandle(array);
  return RemapOutputStatus(ResizeOrCreateHandle(array, bytes));
}

}  // namespace nKVSVAPI100
