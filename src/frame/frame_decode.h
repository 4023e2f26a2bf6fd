// One driver record, or one Ethernet descriptor, into the fields of a host cluster. The payload
// handle is the caller's business: these fill every other field the cluster shows. Inline, since
// they run once per frame inside the record walk.
#ifndef KVSVAPI_FRAME_FRAME_DECODE_H
#define KVSVAPI_FRAME_FRAME_DECODE_H

#include <cstdint>
#include <cstring>

#include "core/timestamps.h"
#include "frame/frame_record.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

namespace nDecode {

constexpr uint8_t kEchoBit = 7;

inline uint8_t Bit(uint8_t flags, uint8_t bit) { return static_cast<uint8_t>((flags >> bit) & 1u); }

inline void StoreRawTime(uint8_t *at, uint64_t rawTime) {
  SvTime time;
  RawTimeToSvTime(&time, &rawTime);
  std::memcpy(at, &time, sizeof time);
}

inline void StoreNsTime(uint8_t *at, uint64_t nsTime) {
  SvTime time;
  NsTimeToSvTime(&time, &nsTime);
  std::memcpy(at, &time, sizeof time);
}

}  // namespace nDecode

// Timestamp, Identifier (29 bits), Type, Extended (identifier bit 29), Echo (flag bit 7).
inline void DecodeCanRecord(const uint8_t *record, uint8_t *cluster) {
  using c = tFrameClusterCAN;
  nDecode::StoreRawTime(cluster + c::kTimestamp, LoadU64(record + kRecordTimestamp));
  const uint32_t identifier = LoadU32(record + kRecordIdentifier);
  StoreU32(cluster + c::kIdentifier, identifier & kCanIdentifierMask);
  cluster[c::kExtended] = (identifier & kExtendedIdentifier) != 0 ? 1 : 0;
  cluster[c::kEcho] = nDecode::Bit(record[kRecordFlags], nDecode::kEchoBit);
  cluster[c::kType] = record[kRecordType];
}

// Timestamp, Identifier (the record's low identifier byte), Echo, Flag0, Type, Info.
inline void DecodeLinRecord(const uint8_t *record, uint8_t *cluster) {
  using c = tFrameClusterLIN;
  nDecode::StoreRawTime(cluster + c::kTimestamp, LoadU64(record + kRecordTimestamp));
  StoreU32(cluster + c::kIdentifier, record[kRecordIdentifier]);
  const uint8_t flags = record[kRecordFlags];
  cluster[c::kEcho] = nDecode::Bit(flags, nDecode::kEchoBit);
  cluster[c::kFlag0] = nDecode::Bit(flags, 0);
  cluster[c::kType] = record[kRecordType];
  cluster[c::kInfo] = record[kRecordInfo];
}

// Timestamp, Identifier (16 bits), Type, Info, Flag0, Flag1, Flag2, Flag4, Flag5, Echo.
inline void DecodeFlexRayRecord(const uint8_t *record, uint8_t *cluster) {
  using c = tFrameClusterFlexRay;
  nDecode::StoreRawTime(cluster + c::kTimestamp, LoadU64(record + kRecordTimestamp));
  const uint16_t identifier = static_cast<uint16_t>(LoadU32(record + kRecordIdentifier));
  std::memcpy(cluster + c::kIdentifier, &identifier, sizeof identifier);
  cluster[c::kType] = record[kRecordType];
  cluster[c::kInfo] = record[kRecordInfo];
  const uint8_t flags = record[kRecordFlags];
  cluster[c::kFlag0] = nDecode::Bit(flags, 0);
  cluster[c::kFlag1] = nDecode::Bit(flags, 1);
  cluster[c::kFlag2] = nDecode::Bit(flags, 2);
  cluster[c::kFlag4] = nDecode::Bit(flags, 4);
  cluster[c::kFlag5] = nDecode::Bit(flags, 5);
  cluster[c::kEcho] = nDecode::Bit(flags, nDecode::kEchoBit);
}

// Both timestamps (1 ns times), Word, Reserved (always 0), Flag0 to Flag3.
inline void DecodeEthernetDescriptor(const tEthernetReadDescriptor &descriptor, uint8_t *cluster) {
  using c = tFrameClusterEthernet;
  nDecode::StoreNsTime(cluster + c::kFirstTimestamp, descriptor.firstTime);
  nDecode::StoreNsTime(cluster + c::kSecondTimestamp, descriptor.secondTime);
  const uint16_t reserved = 0;
  std::memcpy(cluster + c::kReserved, &reserved, sizeof reserved);
  StoreU32(cluster + c::kWord, descriptor.word);
  const uint32_t flags = descriptor.flags;
  cluster[c::kFlag0] = static_cast<uint8_t>(flags & 1u);
  cluster[c::kFlag1] = static_cast<uint8_t>((flags >> 1) & 1u);
  cluster[c::kFlag2] = static_cast<uint8_t>((flags >> 2) & 1u);
  cluster[c::kFlag3] = static_cast<uint8_t>((flags >> 3) & 1u);
}

// Puts `length` bytes into a payload handle (count at byte 0, bytes from byte 4), which must hold
// them.
inline void StorePayload(SvHandle payload, const uint8_t *bytes, uint32_t length) {
  // Where the compiler knows the length is short, it may turn the copy into a string move, whose
  // start-up costs more than moving a few bytes; an opaque length keeps it a call to memcpy.
  __asm__("" : "+r"(length));
  auto *block = static_cast<uint8_t *>(*payload);
  const int32_t count = static_cast<int32_t>(length);
  std::memcpy(block, &count, sizeof count);
  std::memcpy(block + kPayloadHeader, bytes, length);
}

}  // namespace nKVSVAPI100

#endif
