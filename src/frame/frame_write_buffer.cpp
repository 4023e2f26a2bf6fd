#include "frame/frame_write_buffer.h"

#include <algorithm>
#include <cstdlib>

namespace nKVSVAPI100 {

namespace {

// frameBufferSize is 32 bits: a larger need is a need that cannot be met.
constexpr uint64_t kLargestBuffer = UINT32_MAX;

Status NoBuffer(tSessionSlot &slot) {
  ForgetFrameBuffer(slot);
  return kvErrOutOfMemory;
}

}  // namespace

void ForgetFrameBuffer(tSessionSlot &slot) {
  // Tested by the pointer, not by frameBufferSize: a block of 0 bytes is still a block.
  std::free(slot.frameBuffer);
  slot.frameBuffer = nullptr;
  slot.frameBufferSize = 0;
  slot.cachedCount = kUnknown;
  slot.cachedSamples = kUnknown;
}

Status ReplaceFrameBuffer(tSessionSlot &slot, uint64_t size) {
  std::free(slot.frameBuffer);
  slot.frameBuffer = nullptr;
  slot.frameBufferSize = 0;
  if (size > kLargestBuffer) return NoBuffer(slot);
  if (size == 0) return 0;
  slot.frameBuffer = std::malloc(size);
  if (slot.frameBuffer == nullptr) return NoBuffer(slot);
  slot.frameBufferSize = static_cast<uint32_t>(size);
  return 0;
}

Status ExtendFrameBuffer(tSessionSlot &slot, uint64_t size) {
  if (size <= slot.frameBufferSize) return 0;
  if (size > kLargestBuffer) return NoBuffer(slot);
  // Doubling keeps a walk that outgrows the buffer record after record from copying each time.
  const uint64_t grown =
      std::min(std::max(size, uint64_t{slot.frameBufferSize} * 2), kLargestBuffer);
  void *block = std::realloc(slot.frameBuffer, grown);
  if (block == nullptr) return NoBuffer(slot);
  slot.frameBuffer = block;
  slot.frameBufferSize = static_cast<uint32_t>(grown);
  return 0;
}

}  // namespace nKVSVAPI100
