#include "frame/frame_encode_array.h"

#include "frame/frame_record.h"
#include "frame/frame_write_buffer.h"

namespace nKVSVAPI100 {

Status EncodeFrameArray(tSessionSlot &slot, SvHandle frames, int32_t count, uint32_t stride,
                        int32_t payloadMax, eRecordEncoding encoding, uint32_t *size) {
  // Nothing here calls the host, so the array's block stays where it is for the whole walk.
  const uint8_t *cluster = static_cast<const uint8_t *>(*frames) + kArrayHeader;
  Status status = 0;
  // Every record ends within the buffer, so the offset never passes frameBufferSize.
  uint32_t offset = 0;
  for (int32_t i = 0; i < count; ++i, cluster += stride) {
    uint32_t room = slot.frameBufferSize - offset;
    tRecordEncoded record = EncodeFrameRecord(
        cluster, static_cast<uint8_t *>(slot.frameBuffer) + offset, room, payloadMax, encoding);
    if (record.extent > room) {
      const Status extended = ExtendFrameBuffer(slot, uint64_t{offset} + record.extent);
      if (extended < 0) {
        *size = 0;
        return extended;
      }
      room = slot.frameBufferSize - offset;
      record = EncodeFrameRecord(cluster, static_cast<uint8_t *>(slot.frameBuffer) + offset, room,
                                 payloadMax, encoding);
    }
    if (record.status < 0) status = record.status;
    offset += record.step;
  }
  *size = offset;
  return status;
}

}  // namespace nKVSVAPI100
