#include "frame/frame_encode.h"

#include <algorithm>
#include <cstring>

#include "core/timestamps.h"
#include "frame/frame_record.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

namespace {

// The three clusters agree on where the time and the payload handle lie, so one read serves all.
static_assert(tFrameClusterCAN::kTimestamp == 0 && tFrameClusterLIN::kTimestamp == 0 &&
                  tFrameClusterFlexRay::kTimestamp == 0,
              "time at the start of every cluster");
static_assert(tFrameClusterCAN::kPayload == tFrameClusterLIN::kPayload &&
                  tFrameClusterCAN::kPayload == tFrameClusterFlexRay::kPayload,
              "payload handle at one place in every cluster");
constexpr uint32_t kClusterPayload = tFrameClusterCAN::kPayload;

// Record fields that come from the cluster alone.
struct tRecordHeader {
  uint32_t identifier;
  uint8_t type;
  uint8_t flags;
  uint8_t info;
};

uint8_t FlagBit(const uint8_t *cluster, uint32_t offset, unsigned bit) {
  return static_cast<uint8_t>((cluster[offset] != 0 ? 1u : 0u) << bit);
}

tRecordHeader HeaderOf(const uint8_t *c, eRecordEncoding encoding) {
  if (encoding == kEncodeLin) {
    using L = tFrameClusterLIN;
    // Info only means something to the driver when Flag0 says so.
    const bool flag0 = c[L::kFlag0] != 0;
    return {LoadU32(c + L::kIdentifier), c[L::kType], static_cast<uint8_t>(flag0 ? 1 : 0),
            static_cast<uint8_t>(flag0 ? c[L::kInfo] : 0)};
  }
  if (encoding == kEncodeFlexRay) {
    using F = tFrameClusterFlexRay;
    const uint8_t flags = FlagBit(c, F::kFlag0, 0) | FlagBit(c, F::kFlag1, 1) |
                          FlagBit(c, F::kFlag2, 2) | FlagBit(c, F::kFlag4, 4) |
                          FlagBit(c, F::kFlag5, 5);
    return {LoadU16(c + F::kIdentifier), c[F::kType], flags, c[F::kInfo]};
  }
  using C = tFrameClusterCAN;
  uint32_t identifier = LoadU32(c + C::kIdentifier);
  if (c[C::kExtended] != 0) identifier |= kExtendedIdentifier;
  return {identifier, c[C::kType], 0, 0};
}

}  // namespace

tRecordEncoded EncodeFrameRecord(const uint8_t *cluster, uint8_t *record, uint32_t room,
                                 int32_t payloadMax, eRecordEncoding encoding) {
  tRecordHeader header = HeaderOf(cluster, encoding);
  tRecordEncoded out{0, 0, 0};

  SvHandle payload;
  std::memcpy(&payload, cluster + kClusterPayload, sizeof payload);
  const uint8_t *block = payload != nullptr ? static_cast<const uint8_t *>(*payload) : nullptr;
  uint8_t payloadLength = 0;
  uint32_t copied = 0;
  if (block != nullptr) {
    int32_t count;
    std::memcpy(&count, block, sizeof count);
    // A negative count holds no bytes.
    count = std::max(count, 0);
    if (count > payloadMax) {
      // The record stays, empty, so that the records behind it keep their places.
      out.status = kvErrPayloadTruncated;
    } else {
      payloadLength = static_cast<uint8_t>(count);
      copied = payloadLength;
      if (encoding == kEncodeJ1939 && count > 255) {
        header.type = kLongFrameType;
        header.info = static_cast<uint8_t>((static_cast<uint32_t>(count) >> 8) & 7u);
        copied = static_cast<uint32_t>(count);
      }
    }
  }

  if (encoding == kEncodeCanFixed || encoding == kEncodeLin) {
    out.step = kFixedRecordSize;
  } else {
    // Type and Info are final here: a 0xC0 record's step counts its Info bits.
    uint32_t length = payloadLength;
    if (header.type == kLongFrameType) length |= (header.info & 7u) << 8;
    out.step = RecordSize(length);
  }
  const uint32_t payloadEnd = kRecordPayload + copied;
  out.extent = std::max(out.step, payloadEnd);
  if (out.extent > room) return out;

  SvTime time;
  std::memcpy(&time, cluster, sizeof time);
  uint64_t rawTime;
  SvTimeToRawTime(&rawTime, &time);
  StoreU64(record + kRecordTimestamp, rawTime);
  StoreU32(record + kRecordIdentifier, header.identifier);
  record[kRecordType] = header.type;
  record[kRecordFlags] = header.flags;
  record[kRecordInfo] = header.info;
  record[kRecordPayloadLength] = payloadLength;
  if (copied != 0) std::memcpy(record + kRecordPayload, block + kPayloadHeader, copied);
  if (payloadEnd < out.step) std::memset(record + payloadEnd, 0, out.step - payloadEnd);
  return out;
}

}  // namespace nKVSVAPI100
