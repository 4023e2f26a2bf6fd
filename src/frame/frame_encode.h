// One host frame cluster turned into one driver record: the rule that frame writes and the
// conversions to frames share.
#ifndef KVSVAPI_FRAME_FRAME_ENCODE_H
#define KVSVAPI_FRAME_FRAME_ENCODE_H

#include <cstdint>

#include "core/status.h"

namespace nKVSVAPI100 {

// How a cluster becomes a record. The first three are the frameKind values of a CAN session.
enum eRecordEncoding : uint32_t {
  kEncodeCanFixed = 1,     // classic CAN: 24-byte records
  kEncodeCanFlexible = 2,  // CAN FD: each record its own size
  kEncodeJ1939 = 3,        // as CAN FD, with messages above 255 bytes in the 0xC0 long form
  kEncodeLin = 4,          // 24-byte records, Flag0 and Info
  kEncodeFlexRay = 5       // records of their own size, flags and Info from the cluster
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
