// kvsvReadFrameRaw: the driver's records handed to the host byte array as they are, with no
// decode. In this use the slot's payload limit counts the bytes that the handle is sized for, and
// its frame limit the session's capacity in bytes.
#include "core/host_handles.h"
#include "frame/frame_record.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"

using namespace nKVSVAPI100;

namespace {

// A negative count asks for the session's whole capacity in bytes: the records of its whole list,
// each at the session's payload limit, or the size of its queue. Learnt once.
Status ResolveAllBytes(tSessionSlot &slot, uint32_t session, double timeout, int32_t &n) {
  if (MayBlock(timeout)) return kvErrInvalidTimeout;
  if ((slot.cacheFlags & kLimitsKnown) == 0) {
    Status status = kvGetProperty(session, kvPropSession_Mode, 4, &slot.sessionMode);
    if (status < 0) return status;
    if (slot.sessionMode == kvMode_FrameInSinglePoint) {
      uint32_t frames = 0;
      uint32_t payloadMax = 0;
      status = kvGetProperty(session, kvPropSession_NumInList, 4, &frames);
      if (status >= 0) status = kvGetProperty(session, kvPropSession_PayldLenMax, 4, &payloadMax);
      slot.frameLimit = RecordSize(payloadMax) * frames;
    } else {
      status = kvGetProperty(session, kvPropSession_QueueSize, 4, &slot.frameLimit);
    }
    if (status < 0) return status;
    slot.cacheFlags |= kLimitsKnown;
  }
  n = static_cast<int32_t>(slot.frameLimit);
  return 0;
}

// The handle grows to `n` bytes and is never made smaller.
Status SizeHandle(tSessionSlot &slot, SvHandle *data, int32_t n) {
  if (slot.cachedSamples >= n && *data != nullptr &&
      svGetHandleSize(*data) >= slot.requiredHandleSize) {
    return 0;
  }
  slot.requiredHandleSize = static_cast<uint32_t>(n) + kPayloadHandleExtra;
  const Status status = RemapOutputStatus(ResizeOrCreateHandle(data, slot.requiredHandleSize));
  if (status < 0) return status;
  slot.cachedSamples = n;
  return 0;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameRaw(uint32_t session, int32_t numBytes,
                                                   SvHandle *data, double timeout) {
  if (data == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  int32_t n = numBytes;
  Status status = n < 0 ? ResolveAllBytes(slot, session, timeout, n) : 0;
  if (status >= 0) status = SizeHandle(slot, data, n);
  uint32_t bytes = 0;
  if (status >= 0) {
    RegisterAbortIfBlocking(session, timeout);
    // The driver fills the host's block directly, behind its count.
    status = kvReadFrame(session, static_cast<uint8_t *>(**data) + kPayloadHeader,
                         static_cast<uint32_t>(n), timeout, &bytes);
  }
  if (*data != nullptr) ArrayCount(*data) = static_cast<int32_t>(bytes);
  if (status < 0) slot.cachedSamples = kUnknown;
  return status;
}
