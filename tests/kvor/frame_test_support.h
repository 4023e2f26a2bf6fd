// Records as tests write and read them, and frame sessions set up through the driver's calls.
#ifndef KVOR_FRAME_TEST_SUPPORT_H
#define KVOR_FRAME_TEST_SUPPORT_H

#include <cstdint>
#include <cstring>
#include <vector>

#include "kvor_test_support.h"
#include "kvorproperties.h"

struct Rec {
  uint32_t identifier = 0;
  std::vector<uint8_t> payload;
  uint8_t type = 0;
  uint8_t flags = 0;
  uint8_t info = 0;
  uint64_t timestamp = 0;

  bool operator==(const Rec &o) const {
    return identifier == o.identifier && payload == o.payload && type == o.type &&
           flags == o.flags && info == o.info && timestamp == o.timestamp;
  }
};

inline std::ostream &operator<<(std::ostream &out, const Rec &r) {
  return out << "{id " << std::hex << r.identifier << " type " << +r.type << " flags " << +r.flags
             << " info " << +r.info << std::dec << " len " << r.payload.size() << " t "
             << r.timestamp << "}";
}

// Bytes of a record: 24 in the fixed form, otherwise room for the payload rounded up to 8 bytes,
// and never less than 8 of it.
inline uint32_t RecBytes(const Rec &r, bool fixed) {
  const uint32_t length = static_cast<uint32_t>(r.payload.size());
  return fixed || length <= 8 ? 24 : 16 + ((length + 7) / 8) * 8;
}

inline std::vector<uint8_t> Pack(const std::vector<Rec> &recs, bool fixed = false) {
  std::vector<uint8_t> out;
  for (const Rec &r : recs) {
    std::vector<uint8_t> bytes(RecBytes(r, fixed), 0);
    std::memcpy(bytes.data(), &r.timestamp, 8);
    std::memcpy(bytes.data() + 8, &r.identifier, 4);
    bytes[12] = r.type;
    bytes[13] = r.flags;
    bytes[14] = r.info;
    bytes[15] = static_cast<uint8_t>(r.payload.size());
    if (r.type == 0xC0) bytes[14] = static_cast<uint8_t>((r.info & ~7) | (r.payload.size() >> 8));
    std::copy(r.payload.begin(), r.payload.end(), bytes.begin() + 16);
    out.insert(out.end(), bytes.begin(), bytes.end());
  }
  return out;
}

// Walks `size` bytes of records; a fixed-form record's payload is its length up to 8.
inline std::vector<Rec> Unpack(const uint8_t *bytes, uint32_t size, bool fixed = false) {
  std::vector<Rec> recs;
  for (uint32_t at = 0; at < size;) {
    Rec r;
    std::memcpy(&r.timestamp, bytes + at, 8);
    std::memcpy(&r.identifier, bytes + at + 8, 4);
    r.type = bytes[at + 12];
    r.flags = bytes[at + 13];
    r.info = bytes[at + 14];
    uint32_t length = bytes[at + 15];
    if (r.type == 0xC0) length |= (r.info & 7u) << 8;
    r.payload.assign(bytes + at + 16, bytes + at + 16 + (fixed ? std::min(length, 8u) : length));
    at += RecBytes(r, fixed);
    recs.push_back(r);
  }
  return recs;
}

// The driver's Ethernet descriptors: 40 bytes to read into, 16 bytes to write from.
struct EthernetSlot {
  uint64_t data = 0;
  uint32_t length = 0;
  uint32_t flags = 0;
  uint32_t wireLength = 0;
  uint32_t word = 0;
  uint64_t firstTime = 0;
  uint64_t secondTime = 0;
};
static_assert(sizeof(EthernetSlot) == 40, "driver layout");

inline EthernetSlot Room(uint8_t *at, uint32_t size) {
  EthernetSlot slot;
  slot.data = reinterpret_cast<uintptr_t>(at);
  slot.length = size;
  return slot;
}

struct EthernetOut {
  uint64_t data;
  uint32_t length;
  uint32_t padding;
};
static_assert(sizeof(EthernetOut) == 16, "driver layout");

inline EthernetOut Out(const uint8_t *at, uint32_t length) {
  return EthernetOut{reinterpret_cast<uintptr_t>(at), length, 0};
}

inline std::vector<uint8_t> Pattern(uint32_t length, uint8_t seed) {
  std::vector<uint8_t> bytes(length);
  for (uint32_t i = 0; i < length; ++i) bytes[i] = static_cast<uint8_t>(seed + i * 7);
  return bytes;
}

inline void SetU32(uint32_t session, uint32_t id, uint32_t value) {
  ASSERT_EQ(kvSetProperty(session, id, 4, &value), 0) << std::hex << id;
}

inline void SetEcho(uint32_t session) {
  const uint8_t on = 1;
  ASSERT_EQ(kvSetProperty(session, kvPropSession_IntfEchoTx, 1, &on), 0);
}

// Everything waiting in a session, as variable-form records.
inline std::vector<Rec> Drain(uint32_t session) {
  std::vector<uint8_t> buffer(1 << 16);
  uint32_t got = 0;
  EXPECT_EQ(kvhdnReadFrame(session, buffer.data(), static_cast<uint32_t>(buffer.size()), 4096,
                           0.0, &got),
            0);
  return Unpack(buffer.data(), got);
}

#endif
