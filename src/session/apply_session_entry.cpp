#include "session/apply_session_entry.h"

#include <strings.h>

#include "kvsvplatform.h"

namespace nKVSVAPI100 {

namespace {

// Modes whose sessions resample their signals.
bool Resamples(int32_t mode) {
  return mode == kvMode_SignalInWaveform || mode == kvMode_SignalOutWaveform;
}

constexpr int32_t kNoFlexRayKeySlot = 0;
constexpr int32_t kNoLinSchedule = -1;

}  // namespace

Status ApplySessionEntry(uint32_t handle, const tSessionEntry &entry, Status createStatus) {
  Status status = createStatus;
  if (Resamples(entry.mode)) {
    status = kvSetProperty(handle, kvPropSession_ResampRate, sizeof entry.resampleRate,
                           &entry.resampleRate);
    if (status < 0) return status;
  }
  const char *interfaceName = entry.Interface();
  if (strncasecmp(interfaceName, "FlexRay", 7) == 0) {
    if (entry.extra != kNoFlexRayKeySlot)
      status = kvSetProperty(handle, kvPropSession_IntfFlexRayKeySlotID, sizeof entry.extra,
                             &entry.extra);
  } else if (strncasecmp(interfaceName, "LIN", 3) == 0 && entry.extra != kNoLinSchedule) {
    status = kvWriteState(handle, kvState_LINScheduleChange, sizeof entry.extra, &entry.extra);
  }
  return status;
}

}  // namespace nKVSVAPI100
