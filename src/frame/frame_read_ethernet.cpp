// kvsvReadFrameEthernet and kvsvReadFrameEthernetEx: Ethernet frames into tFrameClusterEthernet.
// No payload byte is copied here: each descriptor handed to the driver points into a host payload
// handle, and the driver writes the frame there.
#include <algorithm>
#include <cstring>

#include "core/internal_error.h"
#include "frame/ex_skip.h"
#include "frame/frame_buffer.h"
#include "frame/frame_decode.h"
#include "frame/frame_read_arrays.h"
#include "frame/frame_record.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"

using namespace nKVSVAPI100;

namespace {

constexpr tClusterShape kShape = kShapeOf<tFrameClusterEthernet>;

tEthernetReadDescriptor *Descriptors(const tSessionSlot &slot) {
  return static_cast<tEthernetReadDescriptor *>(slot.frameBuffer);
}

// A negative count asks for what is pending now; nothing of it is kept. A failure here displaces
// whatever the call had so far, but a success does not wipe out an earlier failure.
Status ResolvePending(uint32_t session, double timeout, Status status, int32_t &n) {
  n = 0;
  if (MayBlock(timeout)) return kvErrInvalidTimeout;
  uint32_t pending = 0;
  const Status read = kvGetProperty(session, kvPropSession_NumPend, 4, &pending);
  if (read >= 0) n = static_cast<int32_t>(pending);
  return read < 0 || status >= 0 ? read : status;
}

Status Grow(tSessionSlot &slot, cFrameArrays &arrays, int32_t n, uint64_t capacity) {
  Status status = arrays.SizeFor(slot, n);
  if (status < 0) return status;
  status = arrays.Provide(n, capacity, PayloadHandleBytes(slot.cachedSamples), true);
  if (status < 0) return status;
  return GrowFrameBuffer(slot, static_cast<uint64_t>(n) * sizeof(tEthernetReadDescriptor));
}

// Points descriptor `i` at the payload of element `i` for each of `n` frames, taking spares for
// the elements past the frames' count. The count itself is left as it is.
Status Prepare(const tSessionSlot &slot, const cFrameArrays &arrays, int32_t n, Status status) {
  tEthernetReadDescriptor *descriptors = Descriptors(slot);
  const int32_t owned = arrays.FrameCount();
  for (int32_t i = 0; i < n; ++i) {
    SvHandle payload = nullptr;
    if (i < owned) {
      payload = arrays.Payload(i);
    } else if (!arrays.TakeSpare(i, payload)) {
      status = ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, __LINE__, 0);
      continue;
    }
    // The driver would write through a null address: a frame without a handle cannot be read.
    if (payload == nullptr) {
      status = ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, __LINE__, 0);
      continue;
    }
    // The driver writes up to the limit into each handle, so each must take that much.
    const uint32_t limit = static_cast<uint32_t>(std::max(slot.cachedSamples, 0));
    const Status fitted = FitPayload(payload, limit, slot.cachedSamples);
    if (fitted < 0) {
      status = fitted;
      continue;
    }
    descriptors[i].data =
        reinterpret_cast<uintptr_t>(static_cast<uint8_t *>(*payload) + kPayloadHeader);
    descriptors[i].length = limit;
  }
  return status;
}

// The first `delivered` descriptors into their clusters, each payload's count as the driver gave
// it.
void Deliver(const tSessionSlot &slot, const cFrameArrays &arrays, int32_t delivered) {
  const tEthernetReadDescriptor *descriptors = Descriptors(slot);
  for (int32_t i = 0; i < delivered; ++i) {
    DecodeEthernetDescriptor(descriptors[i], arrays.Element(i));
    SvHandle payload = arrays.Payload(i);
    if (payload != nullptr) ArrayCount(payload) = static_cast<int32_t>(descriptors[i].length);
  }
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameEthernet(uint32_t session, int32_t numFrames,
                                                        SvHandle *frames, SvHandle *spareHandles,
                                                        double timeout) {
  if (frames == nullptr || spareHandles == nullptr) {
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, __LINE__, 0);
  }
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  Status status = 0;
  if (slot.cachedSamples == kUnknown) {
    status = kvGetProperty(session, kvPropSession_PayldLenMax, 4, &slot.cachedSamples);
    if (status < 0) slot.cachedSamples = kUnknown;
  }
  int32_t n = numFrames;
  if (n < 0) status = ResolvePending(session, timeout, status, n);
  cFrameArrays arrays(frames, spareHandles, kShape);
  uint64_t capacity = arrays.ProbeCapacity();
  const bool fits =
      arrays.FitCache(slot, n, false) && CapacityHolds(capacity, slot.cachedSamples);
  if (!fits && status >= 0) {
    const Status grown = Grow(slot, arrays, n, capacity);
    if (grown < 0) status = grown;
  }
  int32_t returned = 0;
  if (status >= 0) {
    if (slot.frameBufferSize != 0) std::memset(slot.frameBuffer, 0, slot.frameBufferSize);
    status = Prepare(slot, arrays, n, status);
  }
  if (status >= 0) {
    RegisterAbortIfBlocking(session, timeout);
    status = kvhdnReadFrameEthernet(session, slot.frameBuffer, static_cast<uint32_t>(n), &returned,
                                    timeout);
  }
  // The driver fills at most `n` descriptors: no more are there.
  const int32_t delivered = std::clamp(returned, 0, std::max(n, 0));
  Deliver(slot, arrays, delivered);
  if (arrays.BothPresent()) {
    arrays.HandBack(delivered);
  } else if (arrays.FramesPresent()) {
    arrays.SetFrameCount(delivered);
  }
  if (status < 0) slot.cachedCount = kUnknown;
  return status;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadFrameEthernetEx(uint32_t session, int32_t numFrames,
                                                          SvHandle *frames,
                                                          SvHandle *spareHandles,
                                                          const uint8_t *skip, double timeout) {
  if (SkipRequested(skip)) return 0;
  return kvsvReadFrameEthernet(session, numFrames, frames, spareHandles, timeout);
}
