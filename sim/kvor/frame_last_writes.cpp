#include "frame_last_writes.h"

#include <algorithm>
#include <cstring>

namespace nKvorSim {

namespace {

uint32_t CopyOut(const std::vector<uint8_t> &bytes, uint8_t *buffer, uint32_t size) {
  const size_t copied = std::min<size_t>(size, bytes.size());
  if (copied != 0) std::memcpy(buffer, bytes.data(), copied);
  return static_cast<uint32_t>(bytes.size());
}

}  // namespace

void FrameLastWrites::KeepRecords(const uint8_t *bytes, uint32_t size) {
  std::lock_guard<std::mutex> lock(mutex_);
  records_.assign(bytes, bytes + size);
}

void FrameLastWrites::KeepEthernet(std::vector<std::vector<uint8_t>> frames) {
  std::lock_guard<std::mutex> lock(mutex_);
  ethernet_ = std::move(frames);
}

uint32_t FrameLastWrites::CopyRecords(uint8_t *buffer, uint32_t size) const {
  std::lock_guard<std::mutex> lock(mutex_);
  return CopyOut(records_, buffer, size);
}

uint32_t FrameLastWrites::EthernetCount() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return static_cast<uint32_t>(ethernet_.size());
}

std::optional<uint32_t> FrameLastWrites::CopyEthernet(uint32_t index, uint8_t *buffer,
                                                      uint32_t size) const {
  std::lock_guard<std::mutex> lock(mutex_);
  if (index >= ethernet_.size()) return std::nullopt;
  return CopyOut(ethernet_[index], buffer, size);
}

}  // namespace nKvorSim
