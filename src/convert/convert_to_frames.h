// The steps that every conversion towards frames shares: the guard, the test of the cache under
// the protocol's form tag, the rebuild, the driver's conversion into the slot's buffer, and the
// unpacking of its records into the host's frame arrays with the recycling of payload handles.
// Which host array the input is (signal values or a byte image) is `tSide`, what the protocol
// does is `tProtocol` (conversion_protocols.h). The raw form hands the records over as they are.
#ifndef KVSVAPI_CONVERT_CONVERT_TO_FRAMES_H
#define KVSVAPI_CONVERT_CONVERT_TO_FRAMES_H

#include <cstdint>

#include "core/host_handles.h"
#include "core/status.h"
#include "frame/frame_read_arrays.h"
#include "frame/frame_record.h"
#include "frame/record_unpack.h"
#include "kvsvapi.h"
#include "session/slot_guard.h"

namespace nKVSVAPI100 {

// Whether the input array exists; a conversion without one converts nothing.
inline bool InputPresent(const SvHandle *input) { return input != nullptr && *input != nullptr; }

template <typename tProtocol, typename tSide>
Status ConvertToFrames(uint32_t session, SvHandle *input, SvHandle *frames,
                       SvHandle *spareHandles) {
  if (frames == nullptr || spareHandles == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  Status status = 0;
  if (!tProtocol::Prepare(slot, session, status)) return status;
  cFrameArrays arrays(frames, spareHandles, tProtocol::kShape);
  // One payload handle stands for all: they are made alike.
  const uint64_t sample = tProtocol::kTestsPayloadHandles ? arrays.ProbeCapacity() : 0;
  bool cached = slot.cachedCount != kUnknown && slot.cacheFlags == tProtocol::kToFramesTag &&
                arrays.FitCache(slot, slot.cachedCount, true);
  if constexpr (tProtocol::kTestsPayloadHandles) {
    cached = cached && slot.cachedSamples != kUnknown && CapacityHolds(sample, slot.cachedSamples);
  }
  if (!cached) status = tProtocol::SizeToFrames(slot, arrays, session, sample);
  uint32_t bytes = 0;
  if (!InputPresent(input)) {
    status = kvErrElementCountMismatch;
  } else if (status >= 0) {
    status = tSide::ToFrames(session, *input, slot.frameBuffer, slot.frameBufferSize, &bytes);
  }
  // Also after a failure, with no bytes: the frames then go to the spares.
  DeliverRecords<tProtocol>(slot, arrays, bytes, status);
  return status;
}

// Sizes the raw byte array for the session's frames, each a record of the payload limit, under the
// raw form tag.
Status SizeRawFrames(tSessionSlot &slot, uint32_t session, SvHandle *rawFrames);

template <typename tSide>
Status ConvertRawToFrames(uint32_t session, SvHandle *input, SvHandle *rawFrames) {
  if (rawFrames == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  Status status = 0;
  const bool cached = slot.cachedCount != kUnknown && slot.cacheFlags == kTagRawToFrames &&
                      *rawFrames != nullptr &&
                      svGetHandleSize(*rawFrames) >= slot.requiredHandleSize;
  if (!cached) status = SizeRawFrames(slot, session, rawFrames);
  uint32_t bytes = 0;
  if (!InputPresent(input)) {
    status = kvErrElementCountMismatch;
  } else if (status >= 0) {
    // The driver writes behind the array's count, straight into the host's block.
    status = tSide::ToFrames(session, *input, static_cast<uint8_t *>(**rawFrames) + kPayloadHeader,
                             slot.requiredHandleSize - kPayloadHandleExtra, &bytes);
  }
  if (*rawFrames != nullptr) ArrayCount(*rawFrames) = status < 0 ? 0 : static_cast<int32_t>(bytes);
  if (status < 0) slot.cachedCount = kUnknown;
  return status;
}

}  // namespace nKVSVAPI100

#endif
