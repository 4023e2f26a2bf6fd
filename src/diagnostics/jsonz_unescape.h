// Decoder of escaped JSON string text, one output byte at a time, so that keys can be compared
// without a copy.
#ifndef KVSVAPI_DIAGNOSTICS_JSONZ_UNESCAPE_H
#define KVSVAPI_DIAGNOSTICS_JSONZ_UNESCAPE_H

#include <cstddef>
#include <cstdint>

namespace jsonz {

class cUnescaper {
 public:
  enum eStep { kEnd, kByte, kBad };

  cUnescaper(const char *text, size_t length) : p_(text), end_(text + length) {}

  // The next decoded byte; never reads outside the `length` bytes given.
  eStep Next(unsigned char &byte);

 private:
  bool ReadUnit(const char *at, uint32_t &unit) const;
  bool Decode();
  void QueueUtf8(uint32_t codePoint);

  const char *p_;
  const char *end_;
  unsigned char queue_[4] = {0, 0, 0, 0};
  int queued_ = 0;
  int taken_ = 0;
};

}  // namespace jsonz

#endif
