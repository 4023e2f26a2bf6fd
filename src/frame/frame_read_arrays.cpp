#include "frame/frame_read_arrays.h"

#include <algorithm>
#include <limits>

namespace nKVSVAPI100 {

namespace {

// Creates or grows `*handle` to `size` bytes unless it is that large already.
Status EnsureOutputSize(SvHandle *handle, uint64_t size) {
  if (*handle != nullptr && svGetHandleSize(*handle) >= size) return 0;
  return RemapOutputStatus(ResizeOrCreateHandle(handle, size));
}

// Bytes of an array of `n` elements of `width` bytes, or 0 if the slot's 32-bit size cannot hold
// it (a negative `n` included).
uint64_t ArrayBytes(int32_t n, uint32_t width) {
  if (n < 0) return 0;
  const uint64_t bytes = static_cast<uint64_t>(n) * width + kArrayHeader;
  return bytes > std::numeric_limits<uint32_t>::max() ? 0 : bytes;
}

}  // namespace

Status GrowPayload(SvHandle payload, uint32_t length, int32_t payloadMax) {
  SvHandle grown = payload;
  return ResizeOrCreateHandle(
      &grown, static_cast<uint64_t>(std::max<int64_t>(PayloadHandleBytes(payloadMax),
                                                      int64_t{length} + kPayloadHandleExtra)));
}

uint64_t cFrameArrays::ProbeCapacity() const {
  if (FrameCount() != 0 && Payload(0) != nullptr) return svGetHandleSize(Payload(0));
  if (SpareCount() != 0 && Spare(0) != nullptr) return svGetHandleSize(Spare(0));
  return 0;
}

bool cFrameArrays::FitCache(const tSessionSlot &slot, int32_t n, bool sparesRequired) const {
  if (!FramesPresent() || (sparesRequired && !SparesPresent())) return false;
  if (static_cast<int64_t>(n) > static_cast<int64_t>(FrameCount()) + SpareCount()) return false;
  if (n > slot.cachedCount) return false;
  return svGetHandleSize(*frames_) >= slot.requiredHandleSize;
}

Status cFrameArrays::SizeFor(tSessionSlot &slot, int32_t n) {
  if (ArrayBytes(n, sizeof(SvHandle)) == 0) return kvErrOutputMemory;
  Status status = SizeFrames(slot, n);
  if (status < 0) return status;
  status = SizeSpares(n);
  if (status < 0) return status;
  slot.cachedCount = n;
  return 0;
}

Status cFrameArrays::SizeFrames(tSessionSlot &slot, int32_t n) {
  const uint64_t bytes = ArrayBytes(n, shape_.size);
  if (bytes == 0) return kvErrOutputMemory;
  slot.requiredHandleSize = static_cast<uint32_t>(bytes);
  return EnsureOutputSize(frames_, bytes);
}

Status cFrameArrays::SizeSpares(int32_t n) {
  const uint64_t bytes = ArrayBytes(n, sizeof(SvHandle));
  if (bytes == 0) return kvErrOutputMemory;
  return EnsureOutputSize(spares_, bytes);
}

Status cFrameArrays::Provide(int32_t n, uint64_t &capacity, uint64_t payloadBytes,
                             bool newAtCapacity) {
  if (capacity < payloadBytes) {
    for (int32_t i = 0; i < FrameCount(); ++i) {
      const Status status = ResizeOrCreateHandle(&Payload(i), payloadBytes);
      if (status < 0) return status;
    }
    for (int32_t i = 0; i < SpareCount(); ++i) {
      const Status status = ResizeOrCreateHandle(&Spare(i), payloadBytes);
      if (status < 0) return status;
    }
    capacity = payloadBytes;
  }
  const uint64_t newBytes = newAtCapacity ? capacity : payloadBytes;
  while (static_cast<int64_t>(FrameCount()) + SpareCount() < n) {
    SvHandle made = svNewHandleClr(newBytes);
    if (made == nullptr) return kvErrOutputMemory;
    const int32_t count = FrameCount();
    Payload(count) = made;
    SetFrameCount(count + 1);
  }
  return 0;
}

bool cFrameArrays::TakeSpare(int32_t i, SvHandle &payload) const {
  int32_t &count = ArrayCount(*spares_);
  if (count <= 0) return false;
  --count;
  SvHandle &top = Spare(count);
  payload = top;
  top = nullptr;
  Payload(i) = payload;
  return true;
}

void cFrameArrays::HandBack(int32_t delivered) const {
  const int32_t count = FrameCount();
  if (delivered < count) {
    const int64_t room = (static_cast<int64_t>(svGetHandleSize(*spares_)) - kArrayHeader) /
                         static_cast<int64_t>(sizeof(SvHandle));
    for (int32_t i = std::max(delivered, 0); i < count; ++i) {
      SvHandle &payload = Payload(i);
      if (payload == nullptr) continue;
      int32_t &next = ArrayCount(*spares_);
      if (next < room) {
        Spare(next) = payload;
        ++next;
      } else {
        svDisposeHandle(payload);
      }
      payload = nullptr;
    }
  }
  SetFrameCount(delivered);
}

}  // namespace nKVSVAPI100
