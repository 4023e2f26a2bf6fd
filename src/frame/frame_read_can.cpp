// kvsvReadFrameCAN and kvsvReadFrameCANEx: frames of a CAN session into tFrameClusterCAN, in the
// session's record form: fixed classic CAN, variable CAN FD, or long J1939 records.
#include <algorithm>

#include "frame/ex_skip.h"
#include "frame/frame_buffer.h"
#include "frame/frame_record.h"
#include "frame/record_frame_read.h"
#include "frame/record_unpack.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"

using namespace nKVSVAPI100;

namespace {

constexpr int32_t kClassicPayloadMax = 8;
constexpr int32_t kFdPayloadMax = 64;
// The application protocol of a J1939 session.
constexpr uint32_t kJ1939Protocol = 1;

// Buffer bytes for `cachedCount` frames: a list session sizes it by the length of each frame of
// its list, and must be read whole. A J1939 buffer always holds one message of full length.
Status SizeBuffer(tSessionSlot &slot, uint32_t session, int32_t n) {
  if ((slot.cacheFlags & kLimitsKnown) == 0) {
    Status status = kvGetProperty(session, kvPropSession_Mode, 4, &slot.sessionMode);
    if (status < 0) return status;
    if (slot.sessionMode == kvMode_FrameInSinglePoint) {
      status = kvGetProperty(session, kvPropSession_NumInList, 4, &slot.frameLimit);
      slot.cacheFlags |= kLimitsKnown;
      if (status < 0) return status;
    }
  }
  const bool list =
      slot.sessionMode == kvMode_FrameInSinglePoint && (slot.cacheFlags & kLimitsKnown) != 0;
  if (list && static_cast<uint32_t>(n) < slot.frameLimit) return kvErrFrameCountTooSmall;
  uint64_t size = 0;
  if (!list) {
    size = static_cast<uint64_t>(slot.cachedCount) * RecordSize(slot.cachedSamples);
  } else if (static_cast<int32_t>(slot.frameLimit) > 0) {
    for (uint32_t i = 0; i < slot.frameLimit; ++i) {
      uint32_t length = 0;
      const Status status =
          kvGetSubProperty(session, i, kvPropHidden_FramePayloadLen, 4, &length);
      if (status < 0) return status;
      size += RecordSize(length);
    }
  } else if (slot.frameKind != kFrameKindJ1939) {
    return 0;  // an empty list keeps the buffer it has
  }
  if (slot.frameKind == kFrameKindJ1939) size = std::max<uint64_t>(size, kLongestLongRecord);
  return GrowFrameBuffer(slot, size);
}

struct tCan {
  static constexpr tClusterShape kShape = kShapeOf<tFrameClusterCAN>;
  static constexpr bool kProbesCapacity = true;

  // The record form and payload limit, learnt once. A failed read of the limit fixes it at 8 for
  // the session's life and fails this call only.
  static bool Learn(tSessionSlot &slot, uint32_t session, cSlotGuard &, Status &status) {
    if (slot.cachedSamples != kUnknown) return true;
    uint32_t value = 0;
    const bool fd =
        kvGetProperty(session, kvPropSession_IntfCanIoMode, 4, &value) >= 0 && value != 0;
    slot.frameKind = fd ? kFrameKindFd : kFrameKindClassic;
    value = 0;
    if (kvGetProperty(session, kvPropSession_ApplicationProtocol, 4, &value) >= 0 &&
        value == kJ1939Protocol) {
      slot.frameKind = kFrameKindJ1939;
      slot.cachedSamples = kFdPayloadMax;
    } else if (slot.frameKind == kFrameKindClassic) {
      slot.cachedSamples = kClassicPayloadMax;
    } else {
      status = kvGetProperty(session, kvPropSession_PayldLenMax, 4, &value);
      slot.cachedSamples = status < 0 ? kClassicPayloadMax
                                      : static_cast<int32_t>(std::clamp<uint32_t>(
                                            value, kClassicPayloadMax, kFdPayloadMax));
    }
    return true;
  }

  static uint32_t RecordBytes(const tSessionSlot &slot) { return RecordSize(slot.cachedSamples); }

  static Status Grow(tSessionSlot &slot, cFrameArrays &arrays, uint32_t session, int32_t n,
                     uint64_t capacity) {
    Status status = arrays.SizeFor(slot, n);
    if (status < 0) return status;
    status = arrays.Provide(n, capacity, PayloadHandleBytes(slot.cachedSamples), false);
    if (status < 0) return status;
    return SizeBuffer(slot, session, n);
  }

  static Status Read(tSessionSlot &slot, uint32_t session, int32_t n, double timeout,
                     uint32_t &bytes) {
    if (slot.frameKind == kFrameKindClassic) {
      return kvReadFrame(session, slot.frameBuffer, static_cast<uint32_t>(n) * kFixedRecordSize,
                         timeout, &bytes);
    }
    return kvhdnReadFrame(session, slot.frameBuffer, slot.frameBufferSize,
                          static_cast<uint32_t>(n), timeout, &bytes);
  }

  static bool Decodes(const tSessionSlot &slot) { return UnpacksCanKind(slot); }

  static int32_t Walk(const tSessionSlot &slot, const cFrameArrays &arrays, uint32_t bytes,
                      Status &status) {
    return UnpackCanRecords(slot, arrays, bytes, status, {__LINE__, __LINE__, __LINE__});
  }
};

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameCAN(uint32_t session, int32_t numFrames,
                                                   SvHandle *frames, SvHandle *spareHandles,
                                                   double timeout) {
  return ReadRecordFrames<tCan>(session, numFrames, frames, spareHandles, timeout);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameCANEx(uint32_t session, int32_t numFrames,
                                                     SvHandle *frames, SvHandle *spareHandles,
                                                     const uint8_t *skip, double timeout) {
  if (SkipRequested(skip)) return 0;
  return kvsvReadFrameCAN(session, numFrames, frames, spareHandles, timeout);
}
