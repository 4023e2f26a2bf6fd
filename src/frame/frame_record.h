// The packed record stream that carries non-Ethernet frames between this library and the driver,
// and the host clusters each protocol turns it into. Integers in records are little-endian, and
// records stand one behind the other with no header.
#ifndef KVSVAPI_FRAME_FRAME_RECORD_H
#define KVSVAPI_FRAME_FRAME_RECORD_H

#include <cstdint>
#include <cstring>

namespace nKVSVAPI100 {

// Offsets within a record.
constexpr uint32_t kRecordTimestamp = 0;
constexpr uint32_t kRecordIdentifier = 8;
constexpr uint32_t kRecordType = 12;
constexpr uint32_t kRecordFlags = 13;
constexpr uint32_t kRecordInfo = 14;
constexpr uint32_t kRecordPayloadLength = 15;
constexpr uint32_t kRecordPayload = 16;

// Records of classic CAN and of LIN are always this size, whatever their length.
constexpr uint32_t kFixedRecordSize = 24;
// The long form of J1939: Info's low three bits extend PayloadLength to eleven bits.
constexpr uint8_t kLongFrameType = 0xC0;
// Bit 29 of a CAN identifier marks an extended identifier.
constexpr uint32_t kExtendedIdentifier = 0x20000000u;
constexpr uint32_t kCanIdentifierMask = 0x1FFFFFFFu;
// The longest J1939 message, and the record that holds it (RecordSize(1785)).
constexpr uint32_t kLongestLongFrame = 1785;
constexpr uint32_t kLongestLongRecord = 0x710;

// The record form of a CAN session, learnt at its first read: fixed 24-byte records, variable
// records up to the session's payload limit, or long J1939 records.
enum eFrameKind : uint32_t { kFrameKindClassic = 1, kFrameKindFd = 2, kFrameKindJ1939 = 3 };

// Bytes a record of `length` payload bytes takes. A zero length keeps room for eight bytes; the
// mask is eleven bits wide, so 2041 to 2047 give 16.
constexpr uint32_t RecordSize(uint32_t length) {
  return (length & 0xFFFFu) == 0 ? 24u : ((length + 7u) & 0x7F8u) + 16u;
}

inline uint64_t LoadU64(const uint8_t *p) {
  uint64_t v;
  std::memcpy(&v, p, sizeof v);
  return v;
}
inline uint16_t LoadU16(const uint8_t *p) {
  uint16_t v;
  std::memcpy(&v, p, sizeof v);
  return v;
}
inline uint32_t LoadU32(const uint8_t *p) {
  uint32_t v;
  std::memcpy(&v, p, sizeof v);
  return v;
}
inline void StoreU64(uint8_t *p, uint64_t v) { std::memcpy(p, &v, sizeof v); }
inline void StoreU32(uint8_t *p, uint32_t v) { std::memcpy(p, &v, sizeof v); }

// Payload length of a record as it stands: eleven bits for the long form, eight otherwise.
inline uint32_t RecordPayloadLength(const uint8_t *record) {
  const uint32_t low = record[kRecordPayloadLength];
  if (record[kRecordType] != kLongFrameType) return low;
  return low | ((record[kRecordInfo] & 7u) << 8);
}

// Host clusters. Each array has its count at byte 0 and its elements from byte 8; the payload
// handle of an element points at a count at byte 0 and bytes from byte 4.
constexpr uint32_t kArrayHeader = 8;
constexpr uint32_t kPayloadHeader = 4;
// A payload handle holds this much more than its payload: the count and alignment slack.
constexpr uint32_t kPayloadHandleExtra = 7;

// tFrameClusterCAN, 32 bytes.
struct tFrameClusterCAN {
  static constexpr uint32_t kSize = 32;
  static constexpr uint32_t kTimestamp = 0;
  static constexpr uint32_t kPayload = 16;
  static constexpr uint32_t kIdentifier = 24;
  static constexpr uint32_t kType = 28;
  static constexpr uint32_t kExtended = 29;
  static constexpr uint32_t kEcho = 30;
};

// tFrameClusterLIN, 32 bytes.
struct tFrameClusterLIN {
  static constexpr uint32_t kSize = 32;
  static constexpr uint32_t kTimestamp = 0;
  static constexpr uint32_t kPayload = 16;
  static constexpr uint32_t kIdentifier = 24;
  static constexpr uint32_t kType = 28;
  static constexpr uint32_t kInfo = 29;
  static constexpr uint32_t kFlag0 = 30;
  static constexpr uint32_t kEcho = 31;
};

// tFrameClusterFlexRay, 40 bytes.
struct tFrameClusterFlexRay {
  static constexpr uint32_t kSize = 40;
  static constexpr uint32_t kTimestamp = 0;
  static constexpr uint32_t kPayload = 16;
  static constexpr uint32_t kIdentifier = 24;  // 16 bits
  static constexpr uint32_t kType = 26;
  static constexpr uint32_t kInfo = 27;
  static constexpr uint32_t kFlag0 = 28;
  static constexpr uint32_t kFlag1 = 29;
  static constexpr uint32_t kFlag2 = 30;
  static constexpr uint32_t kFlag4 = 31;
  static constexpr uint32_t kFlag5 = 32;
  static constexpr uint32_t kEcho = 33;
};

// tFrameClusterEthernet, 56 bytes.
struct tFrameClusterEthernet {
  static constexpr uint32_t kSize = 56;
  static constexpr uint32_t kFirstTimestamp = 0;
  static constexpr uint32_t kSecondTimestamp = 16;
  static constexpr uint32_t kPayload = 32;
  static constexpr uint32_t kWord = 40;
  static constexpr uint32_t kReserved = 44;  // 16 bits
  static constexpr uint32_t kFlag0 = 46;
  static constexpr uint32_t kFlag1 = 47;
  static constexpr uint32_t kFlag2 = 48;
  static constexpr uint32_t kFlag3 = 49;
};

// What the driver's Ethernet read fills, one per frame, 40 bytes.
struct tEthernetReadDescriptor {
  uint64_t data;    // to the driver: where the payload bytes go
  uint32_t length;  // to the driver: capacity; from it: bytes stored
  uint32_t flags;   // bits 0 to 3
  uint32_t reserved;
  uint32_t word;
  uint64_t firstTime;   // 1 ns
  uint64_t secondTime;  // 1 ns
};
static_assert(sizeof(tEthernetReadDescriptor) == 40, "driver layout");

// What the driver's Ethernet write takes, one per frame, 16 bytes.
struct tEthernetWriteDescriptor {
  uint64_t data;  // payload bytes, or 0
  uint32_t length;
  uint32_t padding;
};
static_assert(sizeof(tEthernetWriteDescriptor) == 16, "driver layout");

}  // namespace nKVSVAPI100

#endif
