#include "frame/frame_buffer.h"

#include <cstdlib>
#include <limits>

namespace nKVSVAPI100 {

Status GrowFrameBuffer(tSessionSlot &slot, uint64_t size) {
  if (size <= slot.frameBufferSize) return 0;
  std::free(slot.frameBuffer);
  slot.frameBuffer = nullptr;
  slot.frameBufferSize = 0;
  // The slot counts its buffer in 32 bits: a larger one is as unobtainable as a failed malloc.
  if (size > std::numeric_limits<uint32_t>::max()) return kvErrOutputMemory;
  slot.frameBuffer = std::malloc(size);
  if (slot.frameBuffer == nullptr) return kvErrOutputMemory;
  slot.frameBufferSize = static_cast<uint32_t>(size);
  return 0;
}

}  // namespace nKVSVAPI100
