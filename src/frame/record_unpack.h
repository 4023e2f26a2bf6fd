// The records in the slot's frameBuffer unpacked into the clusters of one protocol, in the record
// form and with the payload rule that the protocol, and for CAN the session's kind, call for.
// Frame reads and the conversions to frames both end this way. A frame that finds no payload
// handle left is reported as coming from the line given.
#ifndef KVSVAPI_FRAME_RECORD_UNPACK_H
#define KVSVAPI_FRAME_RECORD_UNPACK_H

#include <cstdint>

#include "core/status.h"
#include "frame/frame_decode.h"
#include "frame/frame_read_arrays.h"
#include "frame/frame_record.h"
#include "frame/frame_record_walk.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// One report line for each kind of CAN session.
struct tCanReportLines {
  uint32_t classic;
  uint32_t fd;
  uint32_t j1939;
};

// Whether the slot's frameKind is one that CAN records can be unpacked by.
inline bool UnpacksCanKind(const tSessionSlot &slot) {
  return slot.frameKind >= kFrameKindClassic && slot.frameKind <= kFrameKindJ1939;
}

// Classic CAN in fixed records, CAN FD in variable ones clipped to the limit, J1939 in variable
// ones whose handles grow to take a long message. The kind must be one of the three.
inline int32_t UnpackCanRecords(const tSessionSlot &slot, const cFrameArrays &arrays,
                                uint32_t bytes, Status &status, const tCanReportLines &lines) {
  auto *records = static_cast<uint8_t *>(slot.frameBuffer);
  const uint32_t size = slot.frameBufferSize;
  const int32_t max = slot.cachedSamples;
  switch (slot.frameKind) {
    case kFrameKindClassic:
      return WalkRecords<eRecordForm::kFixed, ePayloadRule::kClip, DecodeCanRecord>(
          arrays, records, bytes, size, max, status, lines.classic);
    case kFrameKindFd:
      return WalkRecords<eRecordForm::kVariable, ePayloadRule::kClip, DecodeCanRecord>(
          arrays, records, bytes, size, max, status, lines.fd);
    default:
      return WalkRecords<eRecordForm::kVariable, ePayloadRule::kGrow, DecodeCanRecord>(
          arrays, records, bytes, size, max, status, lines.j1939);
  }
}

// LIN frames are always in fixed records.
inline int32_t UnpackLinRecords(const tSessionSlot &slot, const cFrameArrays &arrays,
                                uint32_t bytes, Status &status, uint32_t line) {
  return WalkRecords<eRecordForm::kFixed, ePayloadRule::kClip, DecodeLinRecord>(
      arrays, static_cast<uint8_t *>(slot.frameBuffer), bytes, slot.frameBufferSize,
      slot.cachedSamples, status, line);
}

// FlexRay frames are in variable records, clipped to the session's limit.
inline int32_t UnpackFlexRayRecords(const tSessionSlot &slot, const cFrameArrays &arrays,
                                    uint32_t bytes, Status &status, uint32_t line) {
  return WalkRecords<eRecordForm::kVariable, ePayloadRule::kClip, DecodeFlexRayRecord>(
      arrays, static_cast<uint8_t *>(slot.frameBuffer), bytes, slot.frameBufferSize,
      slot.cachedSamples, status, line);
}

// The end of every call that fills frame arrays from records: the records go into the arrays when
// both exist and the slot has a payload limit and a form to unpack by (`tProtocol::Decodes`,
// `tProtocol::Walk`), the handles of the elements that no frame took go to the spares, and a
// negative status sends the next call through the sizing again, where everything is checked anew.
// With no bytes, after a failure, this empties the frames into the spares.
template <typename tProtocol>
void DeliverRecords(tSessionSlot &slot, const cFrameArrays &arrays, uint32_t bytes,
                    Status &status) {
  if (arrays.BothPresent() && slot.cachedSamples != 0 && tProtocol::Decodes(slot)) {
    arrays.HandBack(tProtocol::Walk(slot, arrays, bytes, status));
  }
  if (status < 0) slot.cachedCount = kUnknown;
}

}  // namespace nKVSVAPI100

#endif
