#include "diagnostics/jsonz_unescape.h"

#include "diagnostics/jsonz.h"

namespace jsonz {

namespace {

constexpr uint32_t kLargestCodePoint = 0x1FFFFF;

int HexDigit(char c) {
  if (c >= '0' && c <= '9') return c - '0';
  if (c >= 'a' && c <= 'f') return c - 'a' + 10;
  if (c >= 'A' && c <= 'F') return c - 'A' + 10;
  return -1;
}

}  // namespace

// "\uXXXX" at `at`, entirely inside the text.
bool cUnescaper::ReadUnit(const char *at, uint32_t &unit) const {
  if (end_ - at < 6 || at[0] != '\\' || at[1] != 'u') return false;
  unit = 0;
  for (int i = 2; i < 6; ++i) {
    const int digit = HexDigit(at[i]);
    if (digit < 0) return false;
    unit = unit * 16 + static_cast<uint32_t>(digit);
  }
  return true;
}

void cUnescaper::QueueUtf8(uint32_t cp) {
  taken_ = 0;
  if (cp < 0x80) {
    queue_[0] = static_cast<unsigned char>(cp);
    queued_ = 1;
  } else if (cp < 0x800) {
    queue_[0] = static_cast<unsigned char>(0xC0 | (cp >> 6));
    queue_[1] = static_cast<unsigned char>(0x80 | (cp & 0x3F));
    queued_ = 2;
  } else if (cp < 0x10000) {
    queue_[0] = static_cast<unsigned char>(0xE0 | (cp >> 12));
    queue_[1] = static_cast<unsigned char>(0x80 | ((cp >> 6) & 0x3F));
    queue_[2] = static_cast<unsigned char>(0x80 | (cp & 0x3F));
    queued_ = 3;
  } else {
    queue_[0] = static_cast<unsigned char>(0xF0 | (cp >> 18));
    queue_[1] = static_cast<unsigned char>(0x80 | ((cp >> 12) & 0x3F));
    queue_[2] = static_cast<unsigned char>(0x80 | ((cp >> 6) & 0x3F));
    queue_[3] = static_cast<unsigned char>(0x80 | (cp & 0x3F));
    queued_ = 4;
  }
}

// Decodes the escape at p_ into the queue.
bool cUnescaper::Decode() {
  if (end_ - p_ < 2) return false;
  char byte = 0;
  switch (p_[1]) {
    case '"': byte = '"'; break;
    case '\\': byte = '\\'; break;
    case '/': byte = '/'; break;
    case 'b': byte = '\b'; break;
    case 'f': byte = '\f'; break;
    case 'n': byte = '\n'; break;
    case 'r': byte = '\r'; break;
    case 't': byte = '\t'; break;
    case 'u': {
      uint32_t unit = 0;
      if (!ReadUnit(p_, unit)) return false;
      p_ += 6;
      if (unit >= 0xD800 && unit <= 0xDFFF) {
        // The halves are combined as they come; only the result's range is checked.
        uint32_t second = 0;
        if (!ReadUnit(p_, second)) return false;
        p_ += 6;
        const int64_t cp = 0x10000 + (int64_t{unit} - 0xD800) * 0x400 + (int64_t{second} - 0xDC00);
        if (cp < 0 || cp > kLargestCodePoint) return false;
        unit = static_cast<uint32_t>(cp);
      }
      QueueUtf8(unit);
      return true;
    }
    default:
      return false;
  }
  p_ += 2;
  QueueUtf8(static_cast<unsigned char>(byte));
  return true;
}

cUnescaper::eStep cUnescaper::Next(unsigned char &byte) {
  if (taken_ < queued_) {
    byte = queue_[taken_++];
    return kByte;
  }
  if (p_ >= end_) return kEnd;
  if (*p_ != '\\') {
    byte = static_cast<unsigned char>(*p_++);
    return kByte;
  }
  if (!Decode()) return kBad;
  byte = queue_[taken_++];
  return kByte;
}

char *JsonUnescape(const char *text, size_t length, char *target) {
  if (text == nullptr || target == nullptr) return nullptr;
  cUnescaper unescaper(text, length);
  char *out = target;
  unsigned char byte = 0;
  for (;;) {
    switch (unescaper.Next(byte)) {
      case cUnescaper::kByte:
        *out++ = static_cast<char>(byte);
        break;
      case cUnescaper::kEnd:
        *out = '\0';
        return out;
      case cUnescaper::kBad:
        *target = '\0';
        return nullptr;
    }
  }
}

}  // namespace jsonz
