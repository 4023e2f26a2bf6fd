#include "frame/all_frames_count.h"

#include "kvsvplatform.h"
#include "session/abort_cleanup.h"

namespace nKVSVAPI100 {

Status ResolveAllFrames(tSessionSlot &slot, uint32_t session, double timeout,
                        uint32_t recordBytes, Status status, int32_t &n) {
  // A call that may wait cannot also ask for everything: nothing would end the wait early.
  if (MayBlock(timeout)) return kvErrInvalidTimeout;
  if ((slot.cacheFlags & kLimitsKnown) != 0 || status < 0) {
    n = static_cast<int32_t>(slot.frameLimit);
    return status;
  }
  Status read = kvGetProperty(session, kvPropSession_Mode, 4, &slot.sessionMode);
  if (read >= 0) {
    if (slot.sessionMode == kvMode_FrameInSinglePoint) {
      read = kvGetProperty(session, kvPropSession_NumInList, 4, &slot.frameLimit);
      if (read >= 0) slot.cacheFlags |= kLimitsKnown;
    } else {
      read = kvGetProperty(session, kvPropSession_QueueSize, 4, &slot.frameLimit);
      if (read >= 0) {
        slot.frameLimit /= recordBytes;
        slot.cacheFlags |= kLimitsKnown;
      }
    }
  }
  n = static_cast<int32_t>(slot.frameLimit);
  return read < 0 ? read : status;
}

}  // namespace nKVSVAPI100
