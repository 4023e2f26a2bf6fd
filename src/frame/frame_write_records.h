// What the CAN, LIN and FlexRay frame writes share: the set-up of a session for a number of
// frames, and the encode and hand-over of the records to the driver.
#ifndef KVSVAPI_FRAME_FRAME_WRITE_RECORDS_H
#define KVSVAPI_FRAME_FRAME_WRITE_RECORDS_H

#include <cstdint>

#include "core/status.h"
#include "frame/frame_encode.h"
#include "kvsvplatform.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Element count of a host array; a null handle or block is an empty array, and so is a negative
// count.
int32_t FrameArrayCount(SvHandle frames);

// Registers the abort clean-up if the call may block, then hands `size` bytes of records to the
// driver. The driver's status.
Status SendFrameRecords(uint32_t session, const void *records, uint32_t size, double timeout);

// Reads the driver's payload limit, as it stands, into the slot. On failure the limit goes back
// to not known. The driver's status.
Status ReadPayloadLimit(tSessionSlot &slot, uint32_t session);

// Ends the set-up of a session whose property reads gave `status`: after a failure the buffer is
// forgotten and `status` returned; otherwise frameBuffer is replaced by one that holds `count`
// records of the payload limit and the slot is sized for `count` frames. `status`, or 0xBFF63010.
Status SizeRecordBuffer(tSessionSlot &slot, int32_t count, Status status);

// Encodes `count` clusters and, unless a payload was over the limit, writes the records with one
// driver call. The status of the encode or of the driver.
Status EncodeAndSendRecords(tSessionSlot &slot, uint32_t session, SvHandle frames, int32_t count,
                            uint32_t stride, eRecordEncoding encoding, double timeout);

// A whole LIN or FlexRay write: the short way for no frames, the guard, the set-up when the count
// rises above what the slot is sized for, then the encode and the write.
Status WriteRecordFrames(uint32_t session, SvHandle frames, double timeout, uint32_t stride,
                         eRecordEncoding encoding);

}  // namespace nKVSVAPI100

#endif
