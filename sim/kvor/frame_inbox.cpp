#include "frame_inbox.h"

#include "frame_encoding.h"

namespace nKvorSim {

void FrameInbox::Enqueue(Frame frame, uint32_t capacity) {
  std::lock_guard<std::mutex> lock(mutex_);
  if (queue_.size() >= capacity) {
    ++dropped_;
    return;
  }
  queue_.push_back(std::move(frame));
}

void FrameInbox::KeepLatest(uint32_t index, Frame frame) {
  std::lock_guard<std::mutex> lock(mutex_);
  latest_[index] = std::move(frame);
}

void FrameInbox::Flush() {
  std::lock_guard<std::mutex> lock(mutex_);
  queue_.clear();
  latest_.clear();
}

uint32_t FrameInbox::Pending() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return static_cast<uint32_t>(queue_.size());
}

uint64_t FrameInbox::Dropped() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return dropped_;
}

std::optional<Frame> FrameInbox::Latest(uint32_t index) const {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = latest_.find(index);
  if (found == latest_.end()) return std::nullopt;
  return found->second;
}

FrameInbox::Fit FrameInbox::Measure(RecordForm form, uint32_t size, uint32_t maxFrames) const {
  Fit fit;
  for (const Frame &frame : queue_) {
    if (fit.frames == maxFrames) break;
    const uint32_t bytes = EncodedSize(frame, form);
    if (bytes > size - fit.bytes) {
      fit.full = true;
      return fit;
    }
    fit.bytes += bytes;
    ++fit.frames;
  }
  // The smallest record takes as much as a fixed one.
  fit.full = fit.frames == maxFrames || size - fit.bytes < kFixedRecordSize;
  return fit;
}

bool FrameInbox::CanFill(RecordForm form, uint32_t size, uint32_t maxFrames) const {
  std::lock_guard<std::mutex> lock(mutex_);
  return Measure(form, size, maxFrames).full;
}

uint32_t FrameInbox::TakeRecords(RecordForm form, uint8_t *buffer, uint32_t size,
                                 uint32_t maxFrames) {
  std::lock_guard<std::mutex> lock(mutex_);
  const Fit fit = Measure(form, size, maxFrames);
  uint32_t offset = 0;
  for (uint32_t i = 0; i < fit.frames; ++i) {
    EncodeRecord(queue_.front(), form, buffer + offset);
    offset += EncodedSize(queue_.front(), form);
    queue_.pop_front();
  }
  return offset;
}

std::vector<Frame> FrameInbox::TakeFrames(uint32_t maxFrames) {
  std::lock_guard<std::mutex> lock(mutex_);
  std::vector<Frame> taken;
  while (taken.size() < maxFrames && !queue_.empty()) {
    taken.push_back(std::move(queue_.front()));
    queue_.pop_front();
  }
  return taken;
}

}  // namespace nKvorSim
