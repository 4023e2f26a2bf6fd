// kvsvReadFrameLIN and kvsvReadFrameLINEx: frames of a LIN session into tFrameClusterLIN. LIN
// frames carry at most 8 bytes, so the records are always of the fixed form.
#include "frame/ex_skip.h"
#include "frame/frame_buffer.h"
#include "frame/frame_record.h"
#include "frame/record_frame_read.h"
#include "frame/record_unpack.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"

using namespace nKVSVAPI100;

namespace {

constexpr int32_t kLinPayloadMax = 8;

struct tLin {
  static constexpr tClusterShape kShape = kShapeOf<tFrameClusterLIN>;
  // Payload handles are never sized below a LIN frame, so their size is never tested.
  static constexpr bool kProbesCapacity = false;

  static bool Learn(tSessionSlot &, uint32_t, cSlotGuard &, Status &) { return true; }

  static uint32_t RecordBytes(const tSessionSlot &) { return kFixedRecordSize; }

  static Status Grow(tSessionSlot &slot, cFrameArrays &arrays, uint32_t, int32_t n, uint64_t) {
    Status status = arrays.SizeFor(slot, n);
    if (status < 0) return status;
    slot.cachedSamples = kLinPayloadMax;
    uint64_t capacity = PayloadHandleBytes(kLinPayloadMax);
    status = arrays.Provide(n, capacity, capacity, false);
    if (status < 0) return status;
    return GrowFrameBuffer(slot, static_cast<uint64_t>(slot.cachedCount) * kFixedRecordSize);
  }

  static Status Read(tSessionSlot &slot, uint32_t session, int32_t n, double timeout,
                     uint32_t &bytes) {
    return kvReadFrame(session, slot.frameBuffer, static_cast<uint32_t>(n) * kFixedRecordSize,
                       timeout, &bytes);
  }

  static bool Decodes(const tSessionSlot &) { return true; }

  static int32_t Walk(const tSessionSlot &slot, const cFrameArrays &arrays, uint32_t bytes,
                      Status &status) {
    return UnpackLinRecords(slot, arrays, bytes, status, __LINE__);
  }
};

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameLIN(uint32_t session, int32_t numFrames,
                                                   SvHandle *frames, SvHandle *spareHandles,
                                                   double timeout) {
  return ReadRecordFrames<tLin>(session, numFrames, frames, spareHandles, timeout);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameLINEx(uint32_t session, int32_t numFrames,
                                                     SvHandle *frames, SvHandle *spareHandles,
                                                     const uint8_t *skip, double timeout) {
  if (SkipRequested(skip)) return 0;
  return kvsvReadFrameLIN(session, numFrames, frames, spareHandles, timeout);
}
