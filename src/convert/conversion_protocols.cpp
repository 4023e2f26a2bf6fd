#include "convert/conversion_protocols.h"

#include <limits>

#include "convert/can_conversion_kind.h"
#include "core/host_handles.h"
#include "frame/frame_buffer.h"
#include "frame/frame_write_records.h"
#include "kvorproperties.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

namespace {

constexpr int32_t kLinPayloadMax = 8;

// Starts a rebuild towards frames: the tag, the session's frame count and the frames array.
Status SizeFrames(tSessionSlot &slot, cFrameArrays &arrays, uint32_t session, uint32_t tag) {
  slot.cacheFlags = tag;
  const Status status = kvGetProperty(session, kvPropSession_NumFrames, 4, &slot.cachedCount);
  if (status < 0) return status;
  return arrays.SizeFrames(slot, slot.cachedCount);
}

// Ends a rebuild towards frames once the payload limit is known: the spares, a payload handle for
// every frame the driver can return, and a buffer that holds all of their records. Handles below
// `capacity` bytes are resized first; new ones take `capacity` if `newAtCapacity`.
Status SizeHandlesAndBuffer(tSessionSlot &slot, cFrameArrays &arrays, uint64_t capacity,
                            bool newAtCapacity, uint32_t recordBytes) {
  const int32_t count = slot.cachedCount;
  Status status = arrays.SizeSpares(count);
  if (status < 0) return status;
  status = RemapOutputStatus(
      arrays.Provide(count, capacity, PayloadHandleBytes(slot.cachedSamples), newAtCapacity));
  if (status < 0) return status;
  return GrowFrameBuffer(slot, static_cast<uint64_t>(count) * recordBytes);
}

}  // namespace

Status tCanConversion::SizeToFrames(tSessionSlot &slot, cFrameArrays &arrays, uint32_t session,
                                    uint64_t sample) {
  Status status = SizeFrames(slot, arrays, session, kToFramesTag);
  if (status < 0) return status;
  status = LearnCanConversionKind(slot, session);
  if (status < 0) return status;
  return SizeHandlesAndBuffer(slot, arrays, sample, false, RecordSize(slot.cachedSamples));
}

Status tCanConversion::LearnFromFrames(tSessionSlot &slot, uint32_t session) {
  if (slot.cachedSamples != kUnknown) return 0;
  return LearnCanConversionKind(slot, session);
}

Status tLinConversion::SizeToFrames(tSessionSlot &slot, cFrameArrays &arrays, uint32_t session,
                                    uint64_t) {
  Status status = SizeFrames(slot, arrays, session, kToFramesTag);
  if (status < 0) return status;
  status = ReadPayloadLimit(slot, session);
  if (status < 0) return status;
  // The limit that is too long stays known: it is the session's, and no rebuild changes it.
  if (slot.cachedSamples > kLinPayloadMax) return kvErrPayloadMaxTooLarge;
  return SizeHandlesAndBuffer(slot, arrays, std::numeric_limits<uint64_t>::max(), false,
                              kFixedRecordSize);
}

Status tLinConversion::ReadLimitInRebuild(tSessionSlot &slot, uint32_t session) {
  const Status status = ReadPayloadLimit(slot, session);
  if (status >= 0 && slot.cachedSamples > kLinPayloadMax) return kvErrPayloadMaxTooLarge;
  return status;
}

bool tFlexRayConversion::Prepare(tSessionSlot &slot, uint32_t session, Status &status) {
  if (slot.cachedSamples != kUnknown) return true;
  status = ReadPayloadLimit(slot, session);
  return status >= 0;
}

Status tFlexRayConversion::SizeToFrames(tSessionSlot &slot, cFrameArrays &arrays, uint32_t session,
                                        uint64_t sample) {
  Status status = SizeFrames(slot, arrays, session, kToFramesTag);
  if (status < 0) return status;
  status = ReadPayloadLimit(slot, session);
  if (status < 0) return status;
  // New handles match those already there, so that one handle keeps standing for all.
  return SizeHandlesAndBuffer(slot, arrays, sample, true, RecordSize(slot.cachedSamples));
}

Status tFlexRayConversion::ReadLimitInRebuild(tSessionSlot &slot, uint32_t session) {
  return ReadPayloadLimit(slot, session);
}

}  // namespace nKVSVAPI100
