// The steps that every conversion away from frames shares: the empty input that is no work, the
// guard, the test of the cache under the protocol's form tag, the rebuild that sizes the output
// and replaces the frame buffer, the packing of the host's clusters into records, the driver's
// conversion straight into the host's output array, and the count that the output gets. The
// output is `tSide` (conversion_sides.h), the protocol `tProtocol` (conversion_protocols.h). The
// raw form hands the host's records down as they are.
#ifndef KVSVAPI_CONVERT_CONVERT_FROM_FRAMES_H
#define KVSVAPI_CONVERT_CONVERT_FROM_FRAMES_H

#include <cstdint>

#include "core/host_handles.h"
#include "core/status.h"
#include "frame/frame_encode_array.h"
#include "frame/frame_record.h"
#include "frame/frame_write_buffer.h"
#include "frame/frame_write_records.h"
#include "kvsvapi.h"
#include "session/slot_guard.h"

namespace nKVSVAPI100 {

// Whether the output handle is there and as large as the cache needs.
inline bool OutputFits(const tSessionSlot &slot, SvHandle output) {
  return output != nullptr && svGetHandleSize(output) >= slot.requiredHandleSize;
}

// The session's count of the output's elements, and an output handle large enough for them.
template <typename tSide>
Status SizeOutput(tSessionSlot &slot, uint32_t session, uint32_t tag, SvHandle *output) {
  slot.cacheFlags = tag;
  const Status status = tSide::ReadCount(slot, session);
  if (status < 0) return status;
  slot.requiredHandleSize = tSide::HandleBytes(slot.cachedCount);
  if (OutputFits(slot, *output)) return status;
  return RemapOutputStatus(ResizeOrCreateHandle(output, slot.requiredHandleSize));
}

// The end of every conversion away from frames: the output holds the session's count after
// success, nothing after a failure, which also sends the next call through the rebuild.
inline Status FinishFromFrames(tSessionSlot &slot, SvHandle output, Status status) {
  if (status >= 0) {
    ArrayCount(output) = slot.cachedCount;
    return status;
  }
  if (output != nullptr) ArrayCount(output) = 0;
  slot.cachedCount = kUnknown;
  return status;
}

template <typename tProtocol, typename tSide>
Status ConvertFromFrames(uint32_t session, SvHandle *frames, SvHandle *output) {
  const int32_t count = frames != nullptr ? FrameArrayCount(*frames) : 0;
  // No frames is no work, on any session.
  if (count == 0) return 0;
  if (output == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  Status status = tProtocol::LearnFromFrames(slot, session);
  const int64_t needed = int64_t{RecordSize(static_cast<uint32_t>(slot.cachedSamples))} * count;
  const bool cached = slot.cachedCount != kUnknown &&
                      slot.cacheFlags == tProtocol::kFromFramesTag && OutputFits(slot, *output) &&
                      needed <= int64_t{slot.frameBufferSize};
  if (!cached) {
    if (status >= 0) status = SizeOutput<tSide>(slot, session, tProtocol::kFromFramesTag, output);
    if (status >= 0) status = tProtocol::ReadLimitInRebuild(slot, session);
    // The buffer is made for the frames of this call, and a later call with more makes it anew.
    if (status < 0) {
      ForgetFrameBuffer(slot);
    } else {
      const Status replaced = ReplaceFrameBuffer(slot, static_cast<uint64_t>(needed));
      if (replaced < 0) status = replaced;
    }
  }
  uint32_t used = 0;
  if (status >= 0) {
    status = EncodeFrameArray(slot, *frames, count, tProtocol::kShape.size, slot.cachedSamples,
                              tProtocol::Encoding(slot), &used);
  }
  if (status >= 0) {
    status = tSide::FromFrames(session, slot.frameBuffer, used, *output, slot.cachedCount);
  }
  return FinishFromFrames(slot, *output, status);
}

template <typename tSide>
Status ConvertRawFromFrames(uint32_t session, SvHandle *rawFrames, SvHandle *output) {
  const int32_t bytes = rawFrames != nullptr ? FrameArrayCount(*rawFrames) : 0;
  if (bytes == 0) return 0;
  if (output == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  Status status = 0;
  if (slot.cachedCount == kUnknown || slot.cacheFlags != kTagRawFromFrames ||
      !OutputFits(slot, *output)) {
    status = SizeOutput<tSide>(slot, session, kTagRawFromFrames, output);
  }
  if (status >= 0) {
    // The host's records go down untouched: this form owns no buffer.
    status = tSide::FromFrames(session, static_cast<const uint8_t *>(**rawFrames) + kPayloadHeader,
                               static_cast<uint32_t>(bytes), *output, slot.cachedCount);
  }
  return FinishFromFrames(slot, *output, status);
}

}  // namespace nKVSVAPI100

#endif
