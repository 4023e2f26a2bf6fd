// kvsvWriteFrameRaw: records that the host program built itself, handed to the driver as they are.
#include <algorithm>

#include "core/host_handles.h"
#include "frame/frame_record.h"
#include "frame/frame_write_records.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteFrameRaw(uint32_t session, SvHandle data,
                                                    double timeout) {
  // No guard and no slot: nothing is cached, and the driver judges the session.
  if (data == nullptr || *data == nullptr) return SendFrameRecords(session, nullptr, 0, timeout);
  const int32_t bytes = std::max(ArrayCount(data), 0);
  return SendFrameRecords(session, static_cast<const uint8_t *>(*data) + kPayloadHeader,
                          static_cast<uint32_t>(bytes), timeout);
}
