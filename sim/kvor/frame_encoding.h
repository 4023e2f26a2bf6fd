// Frames into records and records into frames.
#ifndef KVOR_SIM_FRAME_ENCODING_H
#define KVOR_SIM_FRAME_ENCODING_H

#include <cstdint>
#include <vector>

#include "driver_status.h"
#include "frame.h"
#include "frame_record.h"

namespace nKvorSim {

// Bytes that `frame` takes as a record of `form`.
uint32_t EncodedSize(const Frame &frame, RecordForm form);

// Writes `frame` as one record of `form` at `out`, EncodedSize bytes, padding zeroed. A fixed-form
// record keeps the first 8 payload bytes and says 8 at most; a variable-form record keeps Type and
// Info as the frame has them, so that a long record comes out as it went in.
void EncodeRecord(const Frame &frame, RecordForm form, uint8_t *out);

// Walks `size` bytes of records of `form` into frames, Timestamp included. The whole buffer is
// refused with kvsimErrInvalidFrame, and `frames` left empty, if a record runs past the end, a
// fixed-form buffer is not a whole number of records, a record cannot hold the payload it claims,
// or a payload is longer than `payloadLimit`. Nothing beyond `size` is read.
Status DecodeRecords(const uint8_t *buffer, uint32_t size, RecordForm form, uint32_t payloadLimit,
                     std::vector<Frame> *frames);

}  // namespace nKvorSim

#endif
