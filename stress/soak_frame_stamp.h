// The stamp that every frame of the soak carries, so that a reader can tell whether a frame it got
// is one that was written: the writer's number and the frame's sequence number at the front of
// the payload, then bytes that follow from both, under an identifier of the writer's own. The
// length too follows from both, within what the writer's kind of CAN allows.
#ifndef KVSVAPI_STRESS_SOAK_FRAME_STAMP_H
#define KVSVAPI_STRESS_SOAK_FRAME_STAMP_H

#include <cstdint>
#include <functional>
#include <string>

namespace nKvsvSoak {

// What a writer sends: classic frames of at most 8 bytes or CAN FD frames of up to 64, under a
// standard or an extended identifier.
struct tWriterKind {
  bool flexibleDataRate;
  bool extended;
};

constexpr uint32_t kClassicPayloadMax = 8;
constexpr uint32_t kFlexiblePayloadMax = 64;
// Writer number, then the sequence number, low byte first.
constexpr uint32_t kStampHeader = 5;

uint32_t StampIdentifier(uint32_t writer, const tWriterKind &kind);
uint32_t StampLength(uint32_t sequence, const tWriterKind &kind);
// Fills `length` bytes of the payload of frame `sequence` of `writer`.
void FillStamp(uint8_t *payload, uint32_t length, uint32_t writer, uint32_t sequence);

// A frame as a reader got it.
struct tDelivered {
  uint32_t identifier;
  uint8_t type;
  uint8_t extended;
  uint8_t echo;
  const uint8_t *payload;
  int32_t length;
};

// The writers' kinds by writer number, and how many sequence numbers each has handed out.
struct tWriterTable {
  const tWriterKind *kinds;
  uint32_t count;
  std::function<uint32_t(uint32_t writer)> issued;
};

// Empty when `frame` is a frame that was written and delivered whole (a classic reader keeps the
// first 8 bytes of a longer frame); otherwise what is wrong with it. The writer and sequence
// number go to the outputs whenever the header could be read.
std::string CheckStamp(const tDelivered &frame, bool flexibleReader, const tWriterTable &writers,
                       uint32_t *writer, uint32_t *sequence);

}  // namespace nKvsvSoak

#endif
