// Frame reads as a host program makes them: two host arrays kept between calls, driver records
// built by hand, and the clusters read back field by field at their fixed offsets.
#ifndef KVSVAPI_TESTS_FRAME_READ_SUPPORT_H
#define KVSVAPI_TESTS_FRAME_READ_SUPPORT_H

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace kvsvtest {

using tBytes = std::vector<uint8_t>;
using tReadFrames = kvsvStatus (*)(uint32_t, int32_t, SvHandle *, SvHandle *, double);

// 5.5 s past the first absolute rawTime, and the SvTime that stands for it.
constexpr uint64_t kGoldenRawTime = 118653336000000000ull + 55000000ull;
constexpr uint64_t kGoldenFraction = 9223372036855000000ull;
constexpr int64_t kGoldenSeconds = 2303704805;

// Appends one record of `size` bytes: the header as given, then as many of `payload` as fit.
inline void AppendRecord(tBytes &out, uint32_t id, uint8_t type, uint8_t flags, uint8_t info,
                         uint8_t lengthField, const tBytes &payload, uint32_t size,
                         uint64_t time = 1) {
  tBytes record(size, 0);
  std::memcpy(record.data(), &time, 8);
  std::memcpy(record.data() + 8, &id, 4);
  record[12] = type;
  record[13] = flags;
  record[14] = info;
  record[15] = lengthField;
  std::copy_n(payload.begin(), std::min<size_t>(payload.size(), size - 16), record.begin() + 16);
  out.insert(out.end(), record.begin(), record.end());
}

// Bytes that differ from frame to frame by `seed`.
inline tBytes Pattern(size_t length, uint8_t seed) {
  tBytes bytes(length);
  for (size_t i = 0; i < length; ++i) bytes[i] = static_cast<uint8_t>(seed + i * 7);
  return bytes;
}

inline tBytes PayloadBytes(SvHandle payload) {
  if (payload == nullptr) return {};
  const auto *block = static_cast<const uint8_t *>(*payload);
  int32_t count = 0;
  std::memcpy(&count, block, 4);
  return tBytes(block + 4, block + 4 + count);
}

// The count of a host array; -1 for no array.
inline int32_t Count(SvHandle array) {
  int32_t count = -1;
  if (array != nullptr) std::memcpy(&count, *array, 4);
  return count;
}

inline SvHandle SpareAt(SvHandle spares, int32_t i) {
  SvHandle handle;
  std::memcpy(&handle, static_cast<const uint8_t *>(*spares) + 8 + i * 8, 8);
  return handle;
}

inline void SetU32(uint32_t session, uint32_t id, uint32_t value) {
  ASSERT_EQ(kvSetProperty(session, id, 4, &value), 0);
}

inline kvsimCallRecord LastCallOf(const char *function) {
  kvsimCallRecord record{};
  for (int32_t i = kvsimLogCount() - 1; i >= 0; --i) {
    if (kvsimLogEntry(i, &record) == 1 && std::strcmp(record.function, function) == 0) return record;
  }
  ADD_FAILURE() << "no call of " << function;
  return record;
}

// A writer and a library reader on a virtual bus, and the two arrays of the reader's program,
// with the cluster layout of one protocol; every handle left in them is disposed of at the end.
// Every host resize moves its block, so that a block pointer kept across one reads freed memory.
class FrameReadTest : public SlotFixture {
 protected:
  FrameReadTest(tReadFrames read, uint32_t stride, uint32_t payloadOffset)
      : read_(read), stride_(stride), payloadOffset_(payloadOffset) {}

  void TearDown() override {
    DisposeArrays();
    SlotFixture::TearDown();
  }

  void Bus(const char *out, const char *in, uint32_t mode = kvMode_FrameInQueued,
           const char *list = "") {
    svsimSetMoveOnResize(1);
    EXPECT_EQ(kvCreateSession(":memory:", "", "", out, kvMode_FrameOutQueued, &writer_), 0);
    reader_ = MakeSession(list, mode, in);
  }
  kvsvStatus Read(int32_t n, double timeout = 0.0) {
    return read_(reader_, n, &frames_, &spares_, timeout);
  }
  void Write(const tBytes &records) {
    ASSERT_EQ(kvWriteFrame(writer_, records.data(), static_cast<uint32_t>(records.size()), 0.0),
              0);
  }
  void Serve(const tBytes &bytes) {
    ASSERT_EQ(kvsimSetReadStream(reader_, bytes.data(), static_cast<uint32_t>(bytes.size()), 0),
              0);
  }

  void DisposeArrays() {
    if (frames_ != nullptr) {
      const size_t capacity = (svGetHandleSize(frames_) - 8) / stride_;
      for (size_t i = 0; i < capacity; ++i) svDisposeHandle(Payload(static_cast<int32_t>(i)));
      svDisposeHandle(frames_);
    }
    if (spares_ != nullptr) {
      for (int32_t i = 0; i < Count(spares_); ++i) svDisposeHandle(SpareAt(spares_, i));
      svDisposeHandle(spares_);
    }
    frames_ = spares_ = nullptr;
  }

  template <typename T>
  T At(int32_t i, uint32_t offset) const {
    T value;
    std::memcpy(&value, static_cast<const uint8_t *>(*frames_) + 8 + i * stride_ + offset,
                sizeof value);
    return value;
  }
  SvHandle Payload(int32_t i) const { return At<SvHandle>(i, payloadOffset_); }
  tBytes PayloadOf(int32_t i) const { return PayloadBytes(Payload(i)); }
  // One byte flag per field, from `first` on.
  tBytes Bytes(int32_t i, uint32_t first, uint32_t count) const {
    tBytes out;
    for (uint32_t k = 0; k < count; ++k) out.push_back(At<uint8_t>(i, first + k));
    return out;
  }
  void ExpectTime(int32_t i, uint32_t offset, uint64_t fraction = kGoldenFraction,
                  int64_t seconds = kGoldenSeconds) const {
    EXPECT_EQ(At<uint64_t>(i, offset), fraction);
    EXPECT_EQ(At<int64_t>(i, offset + 8), seconds);
  }
  const uint8_t *Buffer() const { return static_cast<const uint8_t *>(Slot(reader_)->frameBuffer); }

  tReadFrames read_;
  uint32_t stride_;
  uint32_t payloadOffset_;
  uint32_t writer_ = 0;
  uint32_t reader_ = 0;
  SvHandle frames_ = nullptr;
  SvHandle spares_ = nullptr;
};

}  // namespace kvsvtest

#endif
