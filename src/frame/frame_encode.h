// One host frame cluster turned into one driver record: the rule that frame writes and the
// conversions to frames share.
#ifndef KVSVAPI_FRAME_FRAME_ENCODE_H
#define KVSVAPI_FRAME_FRAME_ENCODE_H

#include <cstdint>

#include "core/status.h"
#include "frame/frame_record.h"

namespace nKVSVAPI100 {

// How a cluster becomes a record. A CAN session's frameKind names its encoding.
enum eRecordEncoding : uint32_t {
  kEncodeCanFixed = kFrameKindClassic,  // 24-byte records
  kEncodeCanFlexible = kFrameKindFd,    // each record its own size
  kEncodeJ1939 = kFrameKindJ1939,       // as CAN FD, messages above 255 bytes in the 0xC0 long form
  kEncodeLin = 4,                       // 24-byte records, Info only under Flag0
  kEncodeFlexRay = 5                    // each record its own size, five flags
};

struct tRecordEncoded {
  uint32_t step;    // where the next record begins, from this record's start
  uint32_t extent;  // bytes written from the record's start; above `step` when a payload runs over
  Status status;    // 0, or 0xBFF6309F for a payload over the limit (the record is kept, empty)
};

// Encodes the cluster at `cluster` (the layout `encoding` implies) into `record`. A payload whose
// count is above `payloadMax` gives an empty record and 0xBFF6309F. The bytes between the payload
// and `step` are zeroed. If `extent` would be above `room`, nothing is written: the caller makes
// room and encodes again.
tRecordEncoded EncodeFrameRecord(const uint8_t *cluster, uint8_t *record, uint32_t room,
                                 int32_t payloadMax, eRecordEncoding encoding);

}  // namespace nKVSVAPI100

#endif
