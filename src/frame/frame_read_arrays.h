// The two host arrays of a frame read: the clusters delivered, and a stack of spare payload
// handles kept between calls, so that the set of payload handles stays the same while the number
// of frames rises and falls. Blocks are reached through their handles at every use, since the
// host may move a block whenever a handle is resized.
#ifndef KVSVAPI_FRAME_FRAME_READ_ARRAYS_H
#define KVSVAPI_FRAME_FRAME_READ_ARRAYS_H

#include <cstdint>

#include "core/host_handles.h"
#include "core/status.h"
#include "frame/frame_record.h"
#include "kvsvplatform.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Where a protocol's cluster keeps its payload handle, and how far apart clusters stand.
struct tClusterShape {
  uint32_t size;
  uint32_t payload;
};
template <typename tCluster>
constexpr tClusterShape kShapeOf{tCluster::kSize, tCluster::kPayload};

// Bytes that a payload handle needs for `payloadMax` bytes: its count and some slack besides.
inline int64_t PayloadHandleBytes(int32_t payloadMax) {
  return int64_t{payloadMax} + kPayloadHandleExtra;
}
// Whether a payload handle of `capacity` bytes takes `payloadMax` bytes. An unknown limit, being
// negative, never asks for more.
inline bool CapacityHolds(uint64_t capacity, int32_t payloadMax) {
  return static_cast<int64_t>(capacity) >= PayloadHandleBytes(payloadMax);
}

// Makes `payload` (not null) take `length` bytes behind its count. The size of one handle stands
// for the others only while a host program keeps them alike; one that is too small is grown here
// as new handles are made, to the session's `payloadMax` (or the length, if that is more), so that
// no copy runs past it. 0 when it fits; otherwise the resize helper's failure, the handle as it was.
Status GrowPayload(SvHandle payload, uint32_t length, int32_t payloadMax);
inline Status FitPayload(SvHandle payload, uint32_t length, int32_t payloadMax) {
  // A host array's block always holds the elements its count claims, so a handle that counts
  // `length` bytes already takes them: a steady read, which finds the lengths of the last one
  // again, asks the host nothing per frame. Only a longer payload costs a size query.
  if (int64_t{ArrayCount(payload)} >= int64_t{length}) return 0;
  if (svGetHandleSize(payload) >= uint64_t{length} + kPayloadHeader) return 0;
  return GrowPayload(payload, length, payloadMax);
}

class cFrameArrays {
 public:
  // Both pointers must be valid; the handles behind them may be null.
  cFrameArrays(SvHandle *frames, SvHandle *spares, tClusterShape shape)
      : frames_(frames), spares_(spares), shape_(shape) {}

  bool FramesPresent() const { return *frames_ != nullptr; }
  bool SparesPresent() const { return *spares_ != nullptr; }
  bool BothPresent() const { return FramesPresent() && SparesPresent(); }
  // An absent array counts as empty.
  int32_t FrameCount() const { return FramesPresent() ? ArrayCount(*frames_) : 0; }
  int32_t SpareCount() const { return SparesPresent() ? ArrayCount(*spares_) : 0; }
  void SetFrameCount(int32_t count) const { ArrayCount(*frames_) = count; }

  uint8_t *Element(int32_t i) const {
    return static_cast<uint8_t *>(**frames_) + kArrayHeader + static_cast<uint64_t>(i) * shape_.size;
  }
  SvHandle &Payload(int32_t i) const {
    return *reinterpret_cast<SvHandle *>(Element(i) + shape_.payload);
  }
  SvHandle &Spare(int32_t i) const { return ArrayData8<SvHandle>(*spares_)[i]; }

  // Size of one payload handle, which stands for all: element 0's, else the first spare's, else 0.
  uint64_t ProbeCapacity() const;

  // Whether the arrays and the slot's cache already suit `n` frames: the arrays are there (the
  // spares only if `sparesRequired`), hold handles for `n` frames between them, and the cache and
  // the frames handle are sized for at least `n`.
  bool FitCache(const tSessionSlot &slot, int32_t n, bool sparesRequired) const;

  // Creates or grows both arrays for `n` frames and records `n` as the slot's cached count. A
  // refusal of the host is 0xBFF630B0.
  Status SizeFor(tSessionSlot &slot, int32_t n);
  // The two halves of SizeFor, for callers that do more between them: the frames array, whose
  // size becomes the slot's requiredHandleSize, and the spares.
  Status SizeFrames(tSessionSlot &slot, int32_t n);
  Status SizeSpares(int32_t n);

  // Gives the arrays `n` payload handles between them. If `capacity` is under `payloadBytes`,
  // every existing handle is first resized to `payloadBytes` (a null place gets a new one; a
  // refusal stops there with 0xBFF63010) and `capacity` takes that value. New handles are made
  // with `capacity` bytes if `newAtCapacity`, else `payloadBytes`, and appended to the frames;
  // a refusal is 0xBFF630B0.
  Status Provide(int32_t n, uint64_t &capacity, uint64_t payloadBytes, bool newAtCapacity);

  // Moves the top spare into the Payload of element `i` and gives it in `payload`; false if there
  // is none left.
  bool TakeSpare(int32_t i, SvHandle &payload) const;

  // Moves the payload handles of the elements from `delivered` to the frames' count onto the
  // spares (disposing of those that find no room there), then sets the count to `delivered`.
  void HandBack(int32_t delivered) const;

 private:
  SvHandle *frames_;
  SvHandle *spares_;
  tClusterShape shape_;
};

}  // namespace nKVSVAPI100

#endif
