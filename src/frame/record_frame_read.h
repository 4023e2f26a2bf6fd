// The steps that every read of driver records into host clusters shares: the guard, the frame
// count, the test of the cache, the growth of the host arrays and the buffer, the driver read, the
// walk and the hand-back of surplus payload handles, and the invalidation of the cache after a
// failure. A protocol supplies, as static members of `tProtocol`:
//
//   kShape             its cluster's shape
//   kProbesCapacity    whether the size of the payload handles is tested before a read
//   Learn(slot, session, guard, status)
//                      what the session is, learnt at its first read; false ends the call at once
//                      with `status`, the guard left as `guard` says
//   RecordBytes(slot)  bytes of a record, to count a queue's bytes in frames
//   Grow(slot, arrays, session, n, capacity)
//                      the host arrays, their payload handles and the buffer, for `n` frames
//   Read(slot, session, n, timeout, bytes)
//                      the driver read into the slot's buffer
//   Decodes(slot)      whether the slot's records can be decoded at all
//   Walk(slot, arrays, bytes, status)
//                      the decode of `bytes` of records; gives the number of frames delivered
#ifndef KVSVAPI_FRAME_RECORD_FRAME_READ_H
#define KVSVAPI_FRAME_RECORD_FRAME_READ_H

#include <cstdint>

#include "core/status.h"
#include "frame/all_frames_count.h"
#include "frame/frame_read_arrays.h"
#include "frame/record_unpack.h"
#include "kvsvapi.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"

namespace nKVSVAPI100 {

template <typename tProtocol>
Status ReadRecordFrames(uint32_t session, int32_t numFrames, SvHandle *frames,
                        SvHandle *spareHandles, double timeout) {
  if (frames == nullptr || spareHandles == nullptr) return kvErrNullArgument;
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  Status status = 0;
  if (!tProtocol::Learn(slot, session, guard, status)) return status;
  int32_t n = numFrames;
  if (n < 0) {
    status = ResolveAllFrames(slot, session, timeout, tProtocol::RecordBytes(slot), status, n);
  }
  cFrameArrays arrays(frames, spareHandles, tProtocol::kShape);
  uint64_t capacity = 0;
  bool fits = arrays.FitCache(slot, n, true);
  if constexpr (tProtocol::kProbesCapacity) {
    capacity = arrays.ProbeCapacity();
    fits = fits && CapacityHolds(capacity, slot.cachedSamples);
  }
  if (!fits && status >= 0) {
    const Status grown = tProtocol::Grow(slot, arrays, session, n, capacity);
    if (grown < 0) status = grown;
  }
  uint32_t bytes = 0;
  if (status >= 0) {
    RegisterAbortIfBlocking(session, timeout);
    status = tProtocol::Read(slot, session, n, timeout, bytes);
  }
  DeliverRecords<tProtocol>(slot, arrays, bytes, status);
  return status;
}

}  // namespace nKVSVAPI100

#endif
