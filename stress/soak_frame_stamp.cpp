#include "soak_frame_stamp.h"

#include <algorithm>
#include <cstdio>

namespace nKvsvSoak {

namespace {

uint8_t StampByte(uint32_t writer, uint32_t sequence, uint32_t offset) {
  return static_cast<uint8_t>(writer * 31u + sequence * 13u + offset * 7u + 1u);
}

std::string Describe(const char *what, uint32_t writer, uint32_t sequence) {
  char text[128];
  std::snprintf(text, sizeof text, "%s (writer %u, sequence %u)", what, writer, sequence);
  return text;
}

}  // namespace

uint32_t StampIdentifier(uint32_t writer, const tWriterKind &kind) {
  return kind.extended ? 0x18FF5000u + writer : 0x100u + writer;
}

uint32_t StampLength(uint32_t sequence, const tWriterKind &kind) {
  const uint32_t span = (kind.flexibleDataRate ? kFlexiblePayloadMax : kClassicPayloadMax) -
                        kStampHeader + 1;
  // Steps by a number prime to every span so that all lengths come round.
  return kStampHeader + (sequence * 7u) % span;
}

void FillStamp(uint8_t *payload, uint32_t length, uint32_t writer, uint32_t sequence) {
  payload[0] = static_cast<uint8_t>(writer);
  for (uint32_t i = 0; i < 4; ++i) payload[1 + i] = static_cast<uint8_t>(sequence >> (8 * i));
  for (uint32_t i = kStampHeader; i < length; ++i) payload[i] = StampByte(writer, sequence, i);
}

std::string CheckStamp(const tDelivered &frame, bool flexibleReader, const tWriterTable &writers,
                       uint32_t *writer, uint32_t *sequence) {
  if (frame.payload == nullptr || frame.length < static_cast<int32_t>(kStampHeader))
    return "a frame too short to carry a stamp";
  *writer = frame.payload[0];
  *sequence = 0;
  for (uint32_t i = 0; i < 4; ++i) *sequence |= uint32_t(frame.payload[1 + i]) << (8 * i);
  if (*writer >= writers.count) return Describe("no such writer", *writer, *sequence);
  const tWriterKind &kind = writers.kinds[*writer];
  // The writer takes its numbers before it writes, so a frame on the bus is below the count.
  if (*sequence >= writers.issued(*writer))
    return Describe("a sequence number not handed out yet", *writer, *sequence);
  if (frame.identifier != StampIdentifier(*writer, kind) || frame.extended != kind.extended)
    return Describe("the wrong identifier", *writer, *sequence);
  if (frame.type != 0 || frame.echo != 0) return Describe("a type or echo not sent", *writer, *sequence);
  const uint32_t written = StampLength(*sequence, kind);
  const uint32_t expected = flexibleReader ? written : std::min(written, kClassicPayloadMax);
  if (static_cast<uint32_t>(frame.length) != expected)
    return Describe("the wrong payload length", *writer, *sequence) + ": " +
           std::to_string(frame.length) + " bytes where " + std::to_string(expected) + " were due";
  for (uint32_t i = kStampHeader; i < expected; ++i)
    if (frame.payload[i] != StampByte(*writer, *sequence, i))
      return Describe("payload bytes not written", *writer, *sequence);
  return {};
}

}  // namespace nKvsvSoak
