// kvsvReadFrameFlexRay and kvsvReadFrameFlexRayEx: frames of a FlexRay session into
// tFrameClusterFlexRay, from variable records up to the session's payload limit.
#include "frame/ex_skip.h"
#include "frame/frame_buffer.h"
#include "frame/frame_record.h"
#include "frame/record_frame_read.h"
#include "frame/record_unpack.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"

using namespace nKVSVAPI100;

namespace {

struct tFlexRay {
  static constexpr tClusterShape kShape = kShapeOf<tFrameClusterFlexRay>;
  static constexpr bool kProbesCapacity = true;

  // The payload limit is the session's own, unclipped. A session whose limit cannot be learnt
  // stays closed to every later call until it is aborted or closed: the guard is not given back.
  static bool Learn(tSessionSlot &slot, uint32_t session, cSlotGuard &guard, Status &status) {
    if (slot.cachedSamples != kUnknown) return true;
    status = kvGetProperty(session, kvPropSession_PayldLenMax, 4, &slot.cachedSamples);
    if (status >= 0) return true;
    slot.cachedSamples = kUnknown;
    guard.LeaveHeld();
    return false;
  }

  static uint32_t RecordBytes(const tSessionSlot &slot) { return RecordSize(slot.cachedSamples); }

  // New handles match the size of those already there, so that one handle keeps standing for all.
  static Status Grow(tSessionSlot &slot, cFrameArrays &arrays, uint32_t, int32_t n,
                     uint64_t capacity) {
    Status status = arrays.SizeFor(slot, n);
    if (status < 0) return status;
    status = arrays.Provide(n, capacity, PayloadHandleBytes(slot.cachedSamples), true);
    if (status < 0) return status;
    return GrowFrameBuffer(slot, static_cast<uint64_t>(slot.cachedCount) * RecordBytes(slot));
  }

  // The size asked for is that of `n` records, whatever the buffer holds beyond them.
  static Status Read(tSessionSlot &slot, uint32_t session, int32_t n, double timeout,
                     uint32_t &bytes) {
    return kvhdnReadFrame(session, slot.frameBuffer, static_cast<uint32_t>(n) * RecordBytes(slot),
                          static_cast<uint32_t>(n), timeout, &bytes);
  }

  static bool Decodes(const tSessionSlot &) { return true; }

  static int32_t Walk(const tSessionSlot &slot, const cFrameArrays &arrays, uint32_t bytes,
                      Status &status) {
    return UnpackFlexRayRecords(slot, arrays, bytes, status, __LINE__);
  }
};

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameFlexRay(uint32_t session, int32_t numFrames,
                                                       SvHandle *frames, SvHandle *spareHandles,
                                                       double timeout) {
  return ReadRecordFrames<tFlexRay>(session, numFrames, frames, spareHandles, timeout);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameFlexRayEx(uint32_t session, int32_t numFrames,
                                                         SvHandle *frames, SvHandle *spareHandles,
                                                         const uint8_t *skip, double timeout) {
  if (SkipRequested(skip)) return 0;
  return kvsvReadFrameFlexRay(session, numFrames, frames, spareHandles, timeout);
}
