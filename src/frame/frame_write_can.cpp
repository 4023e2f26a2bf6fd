// kvsvWriteFrameCAN: a host array of CAN clusters sent as one buffer of records, in the form the
// session's kind wants: fixed for classic CAN, variable for CAN FD, long messages for J1939.
#include <cstdint>
#include <cstring>

#include "frame/frame_record.h"
#include "frame/frame_write_buffer.h"
#include "frame/frame_write_records.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "session/slot_guard.h"

using namespace nKVSVAPI100;

namespace {

// The application protocol under which a CAN session carries J1939.
constexpr uint32_t kApplicationProtocolJ1939 = 1;

// Learns the session's kind and payload limit, and sizes frameBuffer for `count` frames.
Status SetUpCanWrite(tSessionSlot &slot, uint32_t session, int32_t count) {
  // A failed read of the mode or of the protocol is no error: the session is taken as classic.
  uint32_t ioMode = 0;
  const bool flexible =
      kvGetProperty(session, kvPropSession_IntfCanIoMode, 4, &ioMode) >= 0 && ioMode != 0;
  slot.frameKind = flexible ? kFrameKindFd : kFrameKindClassic;
  const Status status = ReadPayloadLimit(slot, session);
  uint32_t protocol = 0;
  if (kvGetProperty(session, kvPropSession_ApplicationProtocol, 4, &protocol) >= 0 &&
      protocol == kApplicationProtocolJ1939)
    slot.frameKind = kFrameKindJ1939;
  return SizeRecordBuffer(slot, count, status);
}

// J1939 messages run up to 1785 bytes whatever the count, so the room they need is measured on
// every call: one long message may follow many short ones.
Status MakeRoomForLongMessages(tSessionSlot &slot, SvHandle frames, int32_t count) {
  const uint8_t *cluster = static_cast<const uint8_t *>(*frames) + kArrayHeader;
  uint32_t total = 0;
  for (int32_t i = 0; i < count; ++i, cluster += tFrameClusterCAN::kSize) {
    SvHandle payload;
    std::memcpy(&payload, cluster + tFrameClusterCAN::kPayload, sizeof payload);
    if (payload == nullptr || *payload == nullptr) continue;
    const int32_t length = *static_cast<const int32_t *>(*payload);
    total += RecordSize(length > 0 ? static_cast<uint32_t>(length) : 0u);
  }
  return total > slot.frameBufferSize ? ReplaceFrameBuffer(slot, total) : 0;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteFrameCAN(uint32_t session, SvHandle frames,
                                                    double timeout) {
  const int32_t count = FrameArrayCount(frames);
  // No frames need no slot: the driver judges the session itself.
  if (count == 0) return SendFrameRecords(session, nullptr, 0, timeout);
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  Status status = 0;
  if (count > slot.cachedCount) status = SetUpCanWrite(slot, session, count);
  if (status >= 0 && slot.frameKind == kFrameKindJ1939)
    status = MakeRoomForLongMessages(slot, frames, count);
  if (status < 0) return status;
  if (slot.frameKind < kFrameKindClassic || slot.frameKind > kFrameKindJ1939)
    return SendFrameRecords(session, slot.frameBuffer, 0, timeout);
  return EncodeAndSendRecords(slot, session, frames, count, tFrameClusterCAN::kSize,
                              static_cast<eRecordEncoding>(slot.frameKind), timeout);
}
