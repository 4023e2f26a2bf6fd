#include "convert/can_conversion_kind.h"

#include "frame/frame_record.h"
#include "frame/frame_write_records.h"
#include "kvorproperties.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

namespace {

// The application protocol under which a CAN session carries J1939.
constexpr uint32_t kApplicationProtocolJ1939 = 1;
constexpr int32_t kLongestFdPayload = 64;
constexpr int32_t kLongestClassicPayload = 8;

}  // namespace

Status LearnCanConversionKind(tSessionSlot &slot, uint32_t session) {
  // A protocol that cannot be read is no error: the session is then taken as plain CAN.
  uint32_t protocol = 0;
  const bool j1939 = kvGetProperty(session, kvPropSession_ApplicationProtocol, 4, &protocol) >= 0 &&
                     protocol == kApplicationProtocolJ1939;
  slot.frameKind = j1939 ? kFrameKindJ1939 : kFrameKindFd;
  const Status status = ReadPayloadLimit(slot, session);
  if (status < 0) return status;
  const int32_t limit = slot.cachedSamples;
  const int32_t longest = j1939 ? static_cast<int32_t>(kLongestLongFrame) : kLongestFdPayload;
  if (limit > longest) {
    slot.cachedSamples = kUnknown;
    return kvErrPayloadMaxTooLarge;
  }
  // Frames that all fit in eight bytes travel in fixed records, J1939 ones included.
  if (limit <= kLongestClassicPayload) slot.frameKind = kFrameKindClassic;
  return status;
}

}  // namespace nKVSVAPI100
