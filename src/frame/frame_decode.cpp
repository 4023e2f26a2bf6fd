#include "frame/frame_decode.h"

#include <cstring>

#include "core/timestamps.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint8_t kEchoBit = 7;

uint8_t Bit(uint8_t flags, uint8_t bit) { return static_cast<uint8_t>((flags >> bit) & 1u); }

void StoreRawTime(uint8_t *at, uint64_t rawTime) {
  SvTime time;
  RawTimeToSvTime(&time, &rawTime);
  std::memcpy(at, &time, sizeof time);
}

void StoreNsTime(uint8_t *at, uint64_t nsTime) {
  SvTime time;
  NsTimeToSvTime(&time, &nsTime);
  std::memcpy(at, &time, sizeof time);
}

}  // namespace

void DecodeCanRecord(const uint8_t *record, uint8_t *cluster) {
  using c = tFrameClusterCAN;
  StoreRawTime(cluster + c::kTimestamp, LoadU64(record + kRecordTimestamp));
  const uint32_t identifier = LoadU32(record + kRecordIdentifier);
  StoreU32(cluster + c::kIdentifier, identifier & kCanIdentifierMask);
  cluster[c::kExtended] = (identifier & kExtendedIdentifier) != 0 ? 1 : 0;
  cluster[c::kEcho] = Bit(record[kRecordFlags], kEchoBit);
  cluster[c::kType] = record[kRecordType];
}

void DecodeLinRecord(const uint8_t *record, uint8_t *cluster) {
  using c = tFrameClusterLIN;
  StoreRawTime(cluster + c::kTimestamp, LoadU64(record + kRecordTimestamp));
  StoreU32(cluster + c::kIdentifier, record[kRecordIdentifier]);
  const uint8_t flags = record[kRecordFlags];
  cluster[c::kEcho] = Bit(flags, kEchoBit);
  cluster[c::kFlag0] = Bit(flags, 0);
  cluster[c::kType] = record[kRecordType];
  cluster[c::kInfo] = record[kRecordInfo];
}

void DecodeFlexRayRecord(const uint8_t *record, uint8_t *cluster) {
  using c = tFrameClusterFlexRay;
  StoreRawTime(cluster + c::kTimestamp, LoadU64(record + kRecordTimestamp));
  const uint16_t identifier = static_cast<uint16_t>(LoadU32(record + kRecordIdentifier));
  std::memcpy(cluster + c::kIdentifier, &identifier, sizeof identifier);
  cluster[c::kType] = record[kRecordType];
  cluster[c::kInfo] = record[kRecordInfo];
  const uint8_t flags = record[kRecordFlags];
  cluster[c::kFlag0] = Bit(flags, 0);
  cluster[c::kFlag1] = Bit(flags, 1);
  cluster[c::kFlag2] = Bit(flags, 2);
  cluster[c::kFlag4] = Bit(flags, 4);
  cluster[c::kFlag5] = Bit(flags, 5);
  cluster[c::kEcho] = Bit(flags, kEchoBit);
}

void DecodeEthernetDescriptor(const tEthernetReadDescriptor &descriptor, uint8_t *cluster) {
  using c = tFrameClusterEthernet;
  StoreNsTime(cluster + c::kFirstTimestamp, descriptor.firstTime);
  StoreNsTime(cluster + c::kSecondTimestamp, descriptor.secondTime);
  const uint16_t reserved = 0;
  std::memcpy(cluster + c::kReserved, &reserved, sizeof reserved);
  StoreU32(cluster + c::kWord, descriptor.word);
  const uint32_t flags = descriptor.flags;
  cluster[c::kFlag0] = static_cast<uint8_t>(flags & 1u);
  cluster[c::kFlag1] = static_cast<uint8_t>((flags >> 1) & 1u);
  cluster[c::kFlag2] = static_cast<uint8_t>((flags >> 2) & 1u);
  cluster[c::kFlag3] = static_cast<uint8_t>((flags >> 3) & 1u);
}

void StorePayload(SvHandle payload, const uint8_t *bytes, uint32_t length) {
  auto *block = static_cast<uint8_t *>(*payload);
  const int32_t count = static_cast<int32_t>(length);
  std::memcpy(block, &count, sizeof count);
  std::memcpy(block + kPayloadHeader, bytes, length);
}

}  // namespace nKVSVAPI100
