#include "convert/conversion_sides.h"

#include <algorithm>

#include "core/host_handles.h"
#include "frame/frame_record.h"
#include "kvorproperties.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint32_t kValueBytes = sizeof(double);

uint8_t *ImageData(SvHandle image) { return static_cast<uint8_t *>(*image) + kPayloadHeader; }

// A negative count holds nothing.
uint32_t HeldCount(SvHandle array) { return static_cast<uint32_t>(std::max(ArrayCount(array), 0)); }

}  // namespace

Status tSignalValues::ToFrames(uint32_t session, SvHandle values, void *records, uint32_t size,
                               uint32_t *bytes) {
  return kvConvertSignalsToFramesSinglePoint(session, ArrayData8<double>(values),
                                             HeldCount(values) * kValueBytes, records, size, bytes);
}

Status tSignalValues::ReadCount(tSessionSlot &slot, uint32_t session) {
  return kvGetProperty(session, kvPropSession_NumInList, 4, &slot.cachedCount);
}

uint32_t tSignalValues::HandleBytes(int32_t count) {
  return static_cast<uint32_t>(count) * kValueBytes + kArrayHeader;
}

Status tSignalValues::FromFrames(uint32_t session, const void *records, uint32_t used,
                                 SvHandle values, int32_t count) {
  // No timestamps are asked for: a conversion has no time of its own.
  return kvConvertFramesToSignalsSinglePoint(session, records, used, ArrayData8<double>(values),
                                             static_cast<uint32_t>(count) * kValueBytes, nullptr,
                                             0);
}

Status tByteImage::ToFrames(uint32_t session, SvHandle image, void *records, uint32_t size,
                            uint32_t *bytes) {
  return kvConvertByteArrayToFramesSinglePoint(session, ImageData(image), HeldCount(image), records,
                                               size, bytes);
}

Status tByteImage::ReadCount(tSessionSlot &slot, uint32_t session) {
  const Status status =
      kvGetSubProperty(session, 0, kvPropHidden_ByteArrayBits, 4, &slot.cachedCount);
  slot.cachedCount >>= 3;
  return status;
}

uint32_t tByteImage::HandleBytes(int32_t count) {
  return static_cast<uint32_t>(count) + kPayloadHandleExtra;
}

Status tByteImage::FromFrames(uint32_t session, const void *records, uint32_t used, SvHandle image,
                              int32_t count) {
  return kvConvertFramesToByteArraySinglePoint(session, records, used, ImageData(image),
                                               static_cast<uint32_t>(count));
}

}  // namespace nKVSVAPI100
