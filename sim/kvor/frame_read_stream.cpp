#include "frame_read_stream.h"

#include <algorithm>
#include <cstring>

#include "frame_record.h"

namespace nKvorSim {

namespace {

// Bytes of the first `frames` records of `bytes`, walked as the variable form. A record that the
// bytes end in the middle of counts up to their end, header included.
uint32_t RecordsSpan(const std::vector<uint8_t> &bytes, uint32_t frames) {
  const uint32_t size = static_cast<uint32_t>(bytes.size());
  uint32_t offset = 0;
  for (uint32_t i = 0; i < frames && offset < size; ++i) {
    if (size - offset < kRecordHeader) return size;
    const uint32_t step = RecordSize(RecordPayloadLength(bytes.data() + offset));
    offset = step > size - offset ? size : offset + step;
  }
  return offset;
}

}  // namespace

void FrameReadStream::Set(const uint8_t *bytes, uint32_t size, bool repeat) {
  std::lock_guard<std::mutex> lock(mutex_);
  bytes_.emplace(bytes, bytes + size);
  repeat_ = repeat;
}

std::optional<uint32_t> FrameReadStream::Serve(uint8_t *buffer, uint32_t size,
                                               std::optional<uint32_t> maxFrames) {
  std::lock_guard<std::mutex> lock(mutex_);
  if (!bytes_) return std::nullopt;
  uint32_t count = std::min(size, static_cast<uint32_t>(bytes_->size()));
  if (maxFrames) count = std::min(count, RecordsSpan(*bytes_, *maxFrames));
  if (count != 0) std::memcpy(buffer, bytes_->data(), count);
  if (!repeat_) bytes_.reset();
  return count;
}

}  // namespace nKvorSim
