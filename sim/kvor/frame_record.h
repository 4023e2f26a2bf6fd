// The driver's packed frame record and the Ethernet descriptors, as they lie in callers' buffers.
// Integers are little-endian; records stand one behind the other with no header.
#ifndef KVOR_SIM_FRAME_RECORD_H
#define KVOR_SIM_FRAME_RECORD_H

#include <cstdint>
#include <cstring>

namespace nKvorSim {

constexpr uint32_t kRecordIdentifierAt = 8;
constexpr uint32_t kRecordTypeAt = 12;
constexpr uint32_t kRecordFlagsAt = 13;
constexpr uint32_t kRecordInfoAt = 14;
constexpr uint32_t kRecordLengthAt = 15;
constexpr uint32_t kRecordHeader = 16;

// Classic CAN and LIN records take 24 bytes each and carry at most 8 payload bytes.
constexpr uint32_t kFixedRecordSize = 24;
constexpr uint32_t kFixedPayloadMax = 8;
// Records of this type carry an eleven-bit length: Info's low three bits are its high bits.
constexpr uint8_t kLongRecordType = 0xC0;
// Flags bit of a frame that the receiving interface sent itself.
constexpr uint8_t kEchoFlag = 0x80;

// How a session's records are laid out in a buffer.
enum class RecordForm { kFixed, kVariable };

// Bytes of a variable-form record with `length` payload bytes: a multiple of 8 that keeps room for
// at least eight bytes. The mask is eleven bits wide, as the driver has always computed it.
constexpr uint32_t RecordSize(uint32_t length) {
  return (length & 0xFFFFu) == 0 ? 24u : ((length + 7u) & 0x7F8u) + 16u;
}

inline uint64_t LoadU64(const uint8_t *p) {
  uint64_t v;
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

// Payload length of a record as it stands in its header.
inline uint32_t RecordPayloadLength(const uint8_t *record) {
  const uint32_t low = record[kRecordLengthAt];
  if (record[kRecordTypeAt] != kLongRecordType) return low;
  return low | ((record[kRecordInfoAt] & 7u) << 8);
}

// One frame of kvhdnReadFrameEthernet, 40 bytes.
struct tEthernetReadDescriptor {
  uint64_t data;        // where the frame's bytes go
  uint32_t length;      // in: room at `data`; out: bytes stored
  uint32_t flags;       // bits 0 to 3
  uint32_t wireLength;  // the frame's whole length
  uint32_t word;        // sequence number on the network
  uint64_t firstTime;   // arrival, 1 ns since 1970
  uint64_t secondTime;  // transmission, 1 ns since 1970
};
static_assert(sizeof(tEthernetReadDescriptor) == 40, "driver layout");

// One frame of kvhdnWriteFrameEthernet, 16 bytes.
struct tEthernetWriteDescriptor {
  uint64_t data;  // the frame's bytes; 0 only for an empty frame
  uint32_t length;
  uint32_t padding;
};
static_assert(sizeof(tEthernetWriteDescriptor) == 16, "driver layout");

// Ethernet descriptor flags.
constexpr uint32_t kEthernetEchoFlag = 0x1;
constexpr uint32_t kEthernetCutFlag = 0x8;

}  // namespace nKvorSim

#endif
