// The host arrays that the soak's programs keep between calls: the two arrays of a frame read,
// and an array of CAN clusters with a payload handle of its own per element for writes.
#ifndef KVSVAPI_STRESS_SOAK_HOST_ARRAYS_H
#define KVSVAPI_STRESS_SOAK_HOST_ARRAYS_H

#include <cstdint>

#include "kvsvapi.h"
#include "soak_frame_stamp.h"

namespace nKvsvSoak {

// A CAN cluster's fields and the host array's layout.
constexpr uint32_t kArrayHeader = 8;
constexpr uint32_t kClusterSize = 32;
constexpr uint32_t kClusterPayload = 16;
constexpr uint32_t kClusterIdentifier = 24;
constexpr uint32_t kClusterType = 28;
constexpr uint32_t kClusterExtended = 29;
constexpr uint32_t kClusterEcho = 30;

// The count of a host array, 0 for none.
int32_t ArrayCount(SvHandle array);

// The frames and spare payload handles of a reader; what the reads left in them goes with them.
class cReadArrays {
 public:
  cReadArrays() = default;
  ~cReadArrays();
  cReadArrays(const cReadArrays &) = delete;
  cReadArrays &operator=(const cReadArrays &) = delete;

  int32_t Frames() const { return ArrayCount(frames); }
  tDelivered Frame(int32_t i) const;

  SvHandle frames = nullptr;
  SvHandle spares = nullptr;
};

// CAN clusters for writes, each with a payload handle that holds up to 64 bytes.
class cWriteArray {
 public:
  explicit cWriteArray(int32_t capacity);
  ~cWriteArray();
  cWriteArray(const cWriteArray &) = delete;
  cWriteArray &operator=(const cWriteArray &) = delete;

  // Element `i` as frame `sequence` of `writer`; the count becomes at least i + 1.
  void Stamp(int32_t i, uint32_t writer, uint32_t sequence, const tWriterKind &kind);
  // Element `i` with a payload of `length` bytes whatever the writer's kind allows.
  void Oversize(int32_t i, uint32_t length);
  void SetCount(int32_t count);
  SvHandle handle() const { return handle_; }

 private:
  uint8_t *Cluster(int32_t i) const;

  int32_t capacity_;
  SvHandle handle_;
};

}  // namespace nKvsvSoak

#endif
