#include "paths/utf8_decode.h"

namespace kvpath {

namespace {

// Length of the sequence that `lead` begins, or 0 if it can't begin one.
int SequenceLength(unsigned char lead) {
  if (lead < 0x80) return 1;
  if ((lead & 0xE0) == 0xC0) return 2;
  if ((lead & 0xF0) == 0xE0) return 3;
  if ((lead & 0xF8) == 0xF0) return 4;
  return 0;
}

uint32_t LeadBits(unsigned char lead, int length) {
  static const unsigned char kMask[5] = {0, 0x7F, 0x1F, 0x0F, 0x07};
  return lead & kMask[length];
}

// The smallest code point that needs a sequence of each length.
const uint32_t kMinimum[5] = {0, 0, 0x80, 0x800, 0x10000};

}  // namespace

int DecodeUtf8(const unsigned char *&position, const unsigned char *end, uint32_t &codePoint) {
  const unsigned char *p = position;
  if (p >= end) return kUtf8Truncated;
  const int length = SequenceLength(*p);
  if (length == 0) return kUtf8BadLead;
  uint32_t value = LeadBits(*p, length);
  ++p;
  for (int i = 1; i < length; ++i, ++p) {
    if (p >= end) return kUtf8Truncated;
    if ((*p & 0xC0) != 0x80) return kUtf8BadContinuation;
    value = (value << 6) | (*p & 0x3Fu);
  }
  if (value < kMinimum[length]) return kUtf8Overlong;
  if (value > 0x10FFFF) return kUtf8AboveMaximum;
  if (value >= 0xD800 && value <= 0xDFFF) return kUtf8Surrogate;
  codePoint = value;
  position = p;
  return kUtf8Ok;
}

uint32_t DecodeUtf8Unchecked(const unsigned char *&position, const unsigned char *end) {
  int length = SequenceLength(*position);
  if (length == 0) length = 1;
  uint32_t value = LeadBits(*position, length);
  ++position;
  for (int i = 1; i < length && position < end; ++i, ++position) {
    value = (value << 6) | (*position & 0x3Fu);
  }
  return value;
}

}  // namespace kvpath
