#include "frame_read_stream.h"

#include <algorithm>
#include <cstdint>
#include <cstring>

#include "frame_record.h"

namespace nKvorSim {

namespace {

// Bytes of the first `frames` records of `bytes`, walked as the variable form, and in `walked`
// how many records they are. A record that the bytes end in the middle of counts up to their end,
// header included.
uint32_t RecordsSpan(const std::vector<uint8_t> &bytes, uint32_t frames, uint32_t *walked) {
  const uint32_t size = static_cast<uint32_t>(bytes.size());
  uint32_t offset = 0;
  uint32_t i = 0;
  for (; i < frames && offset < size; ++i) {
    if (size - offset < kRecordHeader) {
      offset = size;
    } else {
      const uint32_t step = RecordSize(RecordPayloadLength(bytes.data() + offset));
      offset = step > size - offset ? size : offset + step;
    }
  }
  *walked = i;
  return offset;
}

}  // namespace

void FrameReadStream::Set(const uint8_t *bytes, uint32_t size, bool repeat) {
  std::lock_guard<std::mutex> lock(mutex_);
  bytes_.emplace(bytes, bytes + size);
  repeat_ = repeat;
  // Counted once, so that a read asking for all of them copies without a walk.
  RecordsSpan(*bytes_, UINT32_MAX, &records_);
}

std::optional<uint32_t> FrameReadStream::Serve(uint8_t *buffer, uint32_t size,
                                               std::optional<uint32_t> maxFrames) {
  std::lock_guard<std::mutex> lock(mutex_);
  if (!bytes_) return std::nullopt;
  uint32_t count = std::min(size, static_cast<uint32_t>(bytes_->size()));
  if (maxFrames && *maxFrames < records_) {
    uint32_t walked = 0;
    count = std::min(count, RecordsSpan(*bytes_, *maxFrames, &walked));
  }
  if (count != 0) std::memcpy(buffer, bytes_->data(), count);
  if (!repeat_) bytes_.reset();
  return count;
}

}  // namespace nKvorSim
