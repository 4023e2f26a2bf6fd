// The walk over the records that a driver read returned, each decoded into the next cluster of the
// frames array with its payload. Shared by every read of records; the protocol gives its decode,
// the record form and what a payload longer than the limit does, all fixed at compile time so
// that the walk costs no indirection per frame.
#ifndef KVSVAPI_FRAME_FRAME_RECORD_WALK_H
#define KVSVAPI_FRAME_FRAME_RECORD_WALK_H

#include <cstdint>

#include "core/internal_error.h"
#include "core/status.h"
#include "frame/frame_decode.h"
#include "frame/frame_read_arrays.h"
#include "frame/frame_record.h"

namespace nKVSVAPI100 {

// Fixed: 24-byte records, as many as the byte count holds. Variable: each record as long as its
// own payload.
enum class eRecordForm { kFixed, kVariable };
// Clip: a payload over the limit is cut to it, in the record too, and the read reports it; only
// the eight-bit length counts. Grow: the long form, whose handle grows to take the whole payload.
enum class ePayloadRule { kClip, kGrow };

using tRecordDecode = void (*)(const uint8_t *record, uint8_t *cluster);

// Decodes the records of `records` (`bytes` of `bufferSize` filled) into the frames from element
// 0 on: elements below the frames' count keep their own payload handle, later ones take a spare.
// Each handle is sized before its copy, whatever the others' sizes; a handle that cannot be grown
// gets no payload and its failure. Updates `status` as the records demand and returns the number of frames delivered. A frame that
// finds no spare left is reported as coming from `reportLine`.
template <eRecordForm kForm, ePayloadRule kRule, tRecordDecode kDecode>
int32_t WalkRecords(const cFrameArrays &arrays, uint8_t *records, uint32_t bytes,
                    uint32_t bufferSize, int32_t payloadMax, Status &status, uint32_t reportLine) {
  const int32_t owned = arrays.FrameCount();
  const uint32_t fixedRecords = bytes / kFixedRecordSize;
  uint32_t offset = 0;
  int32_t i = 0;
  for (;; ++i) {
    if constexpr (kForm == eRecordForm::kFixed) {
      if (static_cast<uint32_t>(i) >= fixedRecords) break;
      offset = static_cast<uint32_t>(i) * kFixedRecordSize;
    } else {
      if (static_cast<int32_t>(offset) >= static_cast<int32_t>(bytes)) break;
      // After a clipped record the walk goes on from where the clipped length says: what it finds
      // there is not a record of the driver's, and it may not be read beyond the buffer.
      if (uint64_t{offset} + kRecordPayload > bufferSize ||
          uint64_t{offset} + kRecordPayload + RecordPayloadLength(records + offset) > bufferSize)
        break;
    }
    uint8_t *record = records + offset;
    // A frame past the handles there are has no element to go into: the walk ends before it.
    SvHandle payload = nullptr;
    if (i < owned) {
      payload = arrays.Payload(i);
    } else if (!arrays.TakeSpare(i, payload)) {
      status = ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, reportLine, 0);
      break;
    }
    kDecode(record, arrays.Element(i));
    if (payload != nullptr) {
      uint32_t length = 0;
      if constexpr (kRule == ePayloadRule::kClip) {
        if (record[kRecordPayloadLength] > payloadMax) {
          status = kvErrPayloadTruncated;
          record[kRecordPayloadLength] = static_cast<uint8_t>(payloadMax);
        }
        length = record[kRecordPayloadLength];
      } else {
        // A long message may exceed the session's limit; its handle grows to take it whole.
        length = RecordPayloadLength(record);
      }
      const Status fitted = FitPayload(payload, length, payloadMax);
      if (fitted < 0) {
        status = fitted;
      } else {
        StorePayload(payload, record + kRecordPayload, length);
      }
    }
    if constexpr (kForm == eRecordForm::kVariable) offset += RecordSize(RecordPayloadLength(record));
  }
  return kForm == eRecordForm::kFixed ? static_cast<int32_t>(fixedRecords) : i;
}

}  // namespace nKVSVAPI100

#endif
