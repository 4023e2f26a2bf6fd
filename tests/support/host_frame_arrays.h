// Host arrays of frame clusters as a program keeps them between frame reads and conversions: the
// frames array with a payload handle per element, the spare handles beside it, and the fields of
// each element read back at their fixed offsets.
#ifndef KVSVAPI_TESTS_SUPPORT_HOST_FRAME_ARRAYS_H
#define KVSVAPI_TESTS_SUPPORT_HOST_FRAME_ARRAYS_H

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <vector>

#include "kvsim.h"
#include "svsim.h"

namespace kvsvtest {

using tBytes = std::vector<uint8_t>;

// Bytes that differ from frame to frame by `seed`.
inline tBytes Pattern(size_t length, uint8_t seed) {
  tBytes bytes(length);
  for (size_t i = 0; i < length; ++i) bytes[i] = static_cast<uint8_t>(seed + i * 7);
  return bytes;
}

// The bytes of a host byte array: count at byte 0, bytes from byte 4.
inline tBytes PayloadBytes(SvHandle payload) {
  if (payload == nullptr) return {};
  const auto *block = static_cast<const uint8_t *>(*payload);
  int32_t count = 0;
  std::memcpy(&count, block, 4);
  return tBytes(block + 4, block + 4 + count);
}

// A host byte array holding `bytes`.
inline SvHandle ByteArray(const tBytes &bytes) {
  SvHandle h = svNewHandleClr(bytes.size() + 7);
  const auto count = static_cast<int32_t>(bytes.size());
  std::memcpy(*h, &count, 4);
  std::copy(bytes.begin(), bytes.end(), static_cast<uint8_t *>(*h) + 4);
  return h;
}

// The count of a host array; -1 for no array.
inline int32_t Count(SvHandle array) {
  int32_t count = -1;
  if (array != nullptr) std::memcpy(&count, *array, 4);
  return count;
}

inline void SetU32(uint32_t session, uint32_t id, uint32_t value) {
  ASSERT_EQ(kvSetProperty(session, id, 4, &value), 0);
}

// Frames of clusters `stride` bytes apart and the spare handles; every handle left in them is
// disposed of with them.
class cHostArrays {
 public:
  explicit cHostArrays(uint32_t stride = 32, uint32_t payloadOffset = 16)
      : stride_(stride), payloadOffset_(payloadOffset) {}
  ~cHostArrays() { Dispose(); }
  cHostArrays(const cHostArrays &) = delete;
  cHostArrays &operator=(const cHostArrays &) = delete;

  SvHandle frames = nullptr;
  SvHandle spares = nullptr;

  template <typename T>
  T At(int32_t i, uint32_t offset) const {
    T value;
    std::memcpy(&value, static_cast<const uint8_t *>(*frames) + 8 + i * stride_ + offset,
                sizeof value);
    return value;
  }
  SvHandle Payload(int32_t i) const { return At<SvHandle>(i, payloadOffset_); }
  tBytes PayloadOf(int32_t i) const { return PayloadBytes(Payload(i)); }
  // One byte per field, from `first` on.
  tBytes Bytes(int32_t i, uint32_t first, uint32_t count) const {
    tBytes out;
    for (uint32_t k = 0; k < count; ++k) out.push_back(At<uint8_t>(i, first + k));
    return out;
  }
  std::vector<SvHandle> Payloads() const {
    std::vector<SvHandle> out;
    for (int32_t i = 0; i < Count(frames); ++i) out.push_back(Payload(i));
    return out;
  }
  std::vector<SvHandle> Spares() const {
    std::vector<SvHandle> out(static_cast<size_t>(std::max(Count(spares), 0)));
    if (!out.empty()) std::memcpy(out.data(), static_cast<uint8_t *>(*spares) + 8, out.size() * 8);
    return out;
  }

  void Dispose() {
    if (frames != nullptr) {
      const size_t capacity = (svGetHandleSize(frames) - 8) / stride_;
      for (size_t i = 0; i < capacity; ++i) svDisposeHandle(Payload(static_cast<int32_t>(i)));
      svDisposeHandle(frames);
    }
    if (spares != nullptr) {
      for (SvHandle spare : Spares()) svDisposeHandle(spare);
      svDisposeHandle(spares);
    }
    frames = spares = nullptr;
  }

 private:
  uint32_t stride_;
  uint32_t payloadOffset_;
};

}  // namespace kvsvtest

#endif
