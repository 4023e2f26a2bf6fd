// kvsvWriteFrameEthernet: Ethernet clusters sent through descriptors that point at the host's own
// payload bytes, so that nothing is copied. Only the payloads reach the driver.
#include <cstdint>
#include <cstring>

#include "core/internal_error.h"
#include "frame/frame_record.h"
#include "frame/frame_write_buffer.h"
#include "frame/frame_write_records.h"
#include "kvsvapi.h"
#include "session/abort_cleanup.h"
#include "session/slot_guard.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineNullEthernetFrames = 3701;

// Fills one descriptor per cluster. 0, or 0xBFF63253 at the first cluster whose Reserved field is
// not 0: then nothing may go out, not even the frames before it.
Status DescribeFrames(const uint8_t *cluster, int32_t count, uint8_t *descriptors) {
  using E = tFrameClusterEthernet;
  for (int32_t i = 0; i < count; ++i, cluster += E::kSize) {
    if (LoadU16(cluster + E::kReserved) != 0) return kvErrEthernetFrameSize;
    SvHandle payload;
    std::memcpy(&payload, cluster + E::kPayload, sizeof payload);
    tEthernetWriteDescriptor d{0, 0, 0};
    if (payload != nullptr && *payload != nullptr) {
      uint8_t *block = static_cast<uint8_t *>(*payload);
      d.data = reinterpret_cast<uintptr_t>(block + kPayloadHeader);
      d.length = static_cast<uint32_t>(*reinterpret_cast<int32_t *>(block));
    }
    std::memcpy(descriptors + static_cast<size_t>(i) * sizeof d, &d, sizeof d);
  }
  return 0;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteFrameEthernet(uint32_t session, SvHandle frames,
                                                         double timeout) {
  if (frames == nullptr)
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, kLineNullEthernetFrames, 0);
  cSlotGuard guard(session);
  if (!guard) return guard.status();
  tSessionSlot &slot = guard.slot();
  const int32_t count = FrameArrayCount(frames);
  const uint64_t bytes = static_cast<uint64_t>(count) * sizeof(tEthernetWriteDescriptor);
  // The size test keeps a buffer that another kind of call sized from being overrun.
  if (count > slot.cachedCount || bytes > slot.frameBufferSize) {
    slot.cachedSamples = kUnknown;
    const Status status = ReplaceFrameBuffer(slot, bytes);
    if (status < 0) return status;
    slot.cachedCount = count;
  }
  if (count != 0) {
    const Status status = DescribeFrames(static_cast<const uint8_t *>(*frames) + kArrayHeader,
                                         count, static_cast<uint8_t *>(slot.frameBuffer));
    if (status < 0) return status;
  }
  RegisterAbortIfBlocking(session, timeout);
  return kvhdnWriteFrameEthernet(session, slot.frameBuffer, static_cast<uint32_t>(count), timeout);
}
