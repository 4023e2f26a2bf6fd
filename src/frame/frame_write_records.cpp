#include "frame/frame_write_records.h"

#include <algorithm>

#include "core/host_handles.h"
#include "frame/frame_encode_array.h"
#include "frame/frame_record.h"
#include "frame/frame_write_buffer.h"
#include "kvorproperties.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"

namespace nKVSVAPI100 {

int32_t FrameArrayCount(SvHandle frames) {
  if (frames == nullptr || *frames == nullptr) return 0;
  return std::max(ArrayCount(frames), 0);
}

Status SendFrameRecords(uint32_t session, const void *records, uint32_t size, double timeout) {
  RegisterAbortIfBlocking(session, timeout);
  return kvWriteFrame(session, records, size, timeout);
}

Status ReadPayloadLimit(tSessionSlot &slot, uint32_t session) {
  const Status status = kvGetProperty(session, kvPropSession_PayldLenMax, 4, &slot.cachedSamples);
  if (status < 0) slot.cachedSamples = kUnknown;
  return status;
}

Status SizeRecordBuffer(tSessionSlot &slot, int32_t count, Status status) {
  if (status < 0) {
    ForgetFrameBuffer(slot);
    return status;
  }
  const uint64_t perFrame = RecordSize(static_cast<uint32_t>(slot.cachedSamples));
  const Status replaced = ReplaceFrameBuffer(slot, static_cast<uint64_t>(count) * perFrame);
  if (replaced < 0) return replaced;
  slot.cachedCount = count;
  return status;
}

Status EncodeAndSendRecords(tSessionSlot &slot, uint32_t session, SvHandle frames, int32_t count,
                            uint32_t stride, eRecordEncoding encoding, double timeout) {
  uint32_t size = 0;
  const Status status =
      EncodeFrameArray(slot, frames, count, stride, slot.cachedSamples, encoding, &size);
  // One payload over the limit keeps every frame of the call off the bus.
  if (status < 0) return status;
  return SendFrameRecords(session, slot.frameBuffer, size, timeout);
}

Status WriteRecordFrames(uint32_t session, SvHandle frames, double timeout, uint32_t stride,
                         eRecordEncoding encoding) {
  const int32_t count = FrameArrayCount(frames);
  // No frames need no slot: the driver judges the session itself.
  if (count == 0) return SendFrameRecords(session, nullptr, 0, timeout);
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  if (count > slot.cachedCount) {
    const Status status = SizeRecordBuffer(slot, count, ReadPayloadLimit(slot, session));
    if (status < 0) return status;
  }
  return EncodeAndSendRecords(slot, session, frames, count, stride, encoding, timeout);
}

}  // namespace nKVSVAPI100
