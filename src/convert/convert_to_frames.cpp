#include "convert/convert_to_frames.h"

#include <limits>

#include "frame/frame_write_records.h"
#include "kvorproperties.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

Status SizeRawFrames(tSessionSlot &slot, uint32_t session, SvHandle *rawFrames) {
  slot.cacheFlags = kTagRawToFrames;
  Status status = kvGetProperty(session, kvPropSession_NumFrames, 4, &slot.cachedCount);
  if (status < 0) return status;
  status = ReadPayloadLimit(slot, session);
  if (status < 0) return status;
  const uint64_t bytes = static_cast<uint64_t>(static_cast<uint32_t>(slot.cachedCount)) *
                             RecordSize(static_cast<uint32_t>(slot.cachedSamples)) +
                         kPayloadHandleExtra;
  // The slot counts the size in 32 bits: a larger array is one the host cannot give.
  if (bytes > std::numeric_limits<uint32_t>::max()) return kvErrOutputMemory;
  slot.requiredHandleSize = static_cast<uint32_t>(bytes);
  if (*rawFrames != nullptr && svGetHandleSize(*rawFrames) >= bytes) return status;
  return RemapOutputStatus(ResizeOrCreateHandle(rawFrames, bytes));
}

}  // namespace nKVSVAPI100
