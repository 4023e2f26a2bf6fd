#include <cmath>
#include <cstdio>
#include <cstring>
#include <limits>

#include "diagnostics/jsonz.h"
#include "diagnostics/jsonz_unescape.h"

namespace jsonz {

namespace {

// Nesting deeper than this is refused, so that hostile text cannot exhaust the stack.
constexpr int kMaxDepth = 512;
// Longest number text that is converted.
constexpr size_t kNumberText = 63;

const char *const kErrorNames[] = {
    "unknown",                     // 0
    "jsonz_errorValueExpected",    // 1
    "unknown",                     // 2
    "unknown",                     // 3
    "unknown",                     // 4
    "jsonz_errorColonExpected",    // 5
    "jsonz_errorCommaExpected",    // 6
    "unknown",                     // 7
    "jsonz_errorTrailingComma",    // 8
    "jsonz_errorTrailingChar",     // 9
};

bool IsSpace(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }
bool IsDigit(char c) { return c >= '0' && c <= '9'; }
bool IsHex(char c) {
  return IsDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

const char *SkipSpace(const char *p) {
  while (IsSpace(*p)) ++p;
  return p;
}

tValue Failure(const char *at, uint32_t code) {
  tValue value;
  value.kind = kKindError;
  value.start = at;
  value.length = code;
  return value;
}

tValue Success(uint32_t kind, const char *start, uint64_t length, const char *end) {
  tValue value;
  value.kind = kind;
  value.start = start;
  value.length = length;
  value.end = end;
  return value;
}

tValue ParseAt(const char *p, int depth);

tValue ParseString(const char *p) {
  if (*p != '"') return Failure(p, kErrorString);
  const char *q = p + 1;
  for (;;) {
    const unsigned char c = static_cast<unsigned char>(*q);
    if (c == '\0') return Failure(q, kErrorString);
    if (c == '"') return Success(kKindString, p + 1, static_cast<uint64_t>(q - p - 1), q + 1);
    if (c < 0x20) return Failure(q, kErrorEscape);
    if (c != '\\') {
      ++q;
      continue;
    }
    const char escaped = q[1];
    if (escaped != '\0' && std::strchr("\"/\\bfnrt", escaped) != nullptr) {
      q += 2;
    } else if (escaped == 'u') {
      // Each digit is looked at only when the one before it was a digit, so the NUL stops it.
      for (int i = 2; i < 6; ++i) {
        if (!IsHex(q[i])) return Failure(q, kErrorEscape);
      }
      q += 6;
    } else {
      return Failure(q, kErrorEscape);
    }
  }
}

tValue ParseNumber(const char *p) {
  const char *q = p;
  uint32_t isReal = 0;
  if (*q == '-') ++q;
  if (!IsDigit(*q)) return Failure(q, kErrorValueExpected);
  while (IsDigit(*q)) ++q;
  if (*q == '.') {
    ++q;
    if (!IsDigit(*q)) return Failure(q, kErrorValueExpected);
    while (IsDigit(*q)) ++q;
    isReal = 1;
  }
  if (*q == 'e' || *q == 'E') {
    ++q;
    if (*q == '+' || *q == '-') ++q;
    if (!IsDigit(*q)) return Failure(q, kErrorValueExpected);
    while (IsDigit(*q)) ++q;
    isReal = 1;
  }
  tValue value = Success(kKindNumber, p, static_cast<uint64_t>(q - p), q);
  value.isReal = isReal;
  return value;
}

// Objects and arrays differ only in their brackets, their error code and the key of a member.
tValue ParseContainer(const char *p, int depth, bool object) {
  const char open = object ? '{' : '[';
  const char close = object ? '}' : ']';
  const uint32_t ownError = object ? kErrorObject : kErrorArray;
  if (*p != open || depth >= kMaxDepth) return Failure(p, ownError);
  const char *q = SkipSpace(p + 1);
  if (*q == close) return Success(object ? kKindObject : kKindArray, p, 0, q + 1);
  for (;;) {
    if (*q == '\0') return Failure(q, ownError);
    if (object) {
      const tValue key = ParseString(q);
      if (key.kind == kKindError) return key;
      q = SkipSpace(key.end);
      if (*q != ':') return Failure(q, *q == '\0' ? ownError : kErrorColonExpected);
      q = SkipSpace(q + 1);
      if (*q == '\0') return Failure(q, ownError);
    }
    const tValue member = ParseAt(q, depth + 1);
    if (member.kind == kKindError) return member;
    q = SkipSpace(member.end);
    if (*q == close) return Success(object ? kKindObject : kKindArray, p, 0, q + 1);
    if (*q == '\0') return Failure(q, ownError);
    if (*q != ',') return Failure(q, kErrorCommaExpected);
    q = SkipSpace(q + 1);
    if (*q == close) return Failure(q, kErrorTrailingComma);
  }
}

// Matches a literal, failing where the text departs from it.
tValue ParseWord(const char *p, const char *word, uint32_t kind, uint64_t length) {
  const char *q = p;
  for (const char *w = word; *w != '\0'; ++w, ++q) {
    if (*q != *w) return Failure(q, kErrorValueExpected);
  }
  return Success(kind, p, length, q);
}

tValue ParseAt(const char *p, int depth) {
  tValue best;
  bool haveFailure = false;
  // Tried in this order; the failure that got farthest is kept, the earliest of equals.
  for (int parser = 0; parser < 6; ++parser) {
    tValue value;
    switch (parser) {
      case 0: value = ParseString(p); break;
      case 1: value = ParseNumber(p); break;
      case 2: value = ParseContainer(p, depth, true); break;
      case 3: value = ParseContainer(p, depth, false); break;
      case 4: {
        value = ParseWord(p, "true", kKindBoolean, 1);
        if (value.kind == kKindError) {
          const tValue no = ParseWord(p, "false", kKindBoolean, 0);
          if (no.kind != kKindError || no.start > value.start) value = no;
        }
        break;
      }
      default: value = ParseWord(p, "null", kKindNull, 0); break;
    }
    if (value.kind != kKindError) return value;
    if (!haveFailure || value.start > best.start) best = value;
    haveFailure = true;
  }
  return best;
}

// True when the escaped key text equals `key`.
bool KeyEquals(const char *text, size_t length, const char *key) {
  cUnescaper unescaper(text, length);
  const unsigned char *k = reinterpret_cast<const unsigned char *>(key);
  unsigned char byte = 0;
  for (;;) {
    switch (unescaper.Next(byte)) {
      case cUnescaper::kEnd: return *k == '\0';
      case cUnescaper::kBad: return false;
      case cUnescaper::kByte:
        if (*k == '\0' || *k != byte) return false;
        ++k;
        break;
    }
  }
}

// The locale's decimal sign, as printf writes it.
char DecimalSign() {
  char text[16];
  std::snprintf(text, sizeof text, "%.1f", 1.5);
  return text[1];
}

int32_t CutToInt32(double value) {
  if (std::isnan(value)) return 0;
  if (value >= static_cast<double>(std::numeric_limits<int32_t>::max())) {
    return std::numeric_limits<int32_t>::max();
  }
  if (value <= static_cast<double>(std::numeric_limits<int32_t>::min())) {
    return std::numeric_limits<int32_t>::min();
  }
  return static_cast<int32_t>(value);
}

}  // namespace

const char *ErrorName(uint32_t code) {
  return code < sizeof kErrorNames / sizeof kErrorNames[0] ? kErrorNames[code] : "unknown";
}

tValue ParseValue(const char *text) {
  if (text == nullptr) return Failure(nullptr, kErrorValueExpected);
  return ParseAt(SkipSpace(text), 0);
}

tValue ParseDocument(const char *text) {
  const tValue value = ParseValue(text);
  if (value.kind == kKindError) return value;
  const char *rest = SkipSpace(value.end);
  if (*rest != '\0') return Failure(rest, kErrorTrailingChar);
  return value;
}

const char *JsonFindKey(const char *object, const char *key) {
  if (object == nullptr || key == nullptr) return nullptr;
  const char *p = SkipSpace(object);
  if (*p != '{') return nullptr;
  p = SkipSpace(p + 1);
  if (*p == '}') return nullptr;
  for (;;) {
    const tValue name = ParseString(p);
    if (name.kind == kKindError) return nullptr;
    p = SkipSpace(name.end);
    if (*p != ':') return nullptr;
    const char *valueStart = SkipSpace(p + 1);
    if (KeyEquals(name.start, static_cast<size_t>(name.length), key)) return valueStart;
    const tValue value = ParseAt(valueStart, 1);
    if (value.kind == kKindError) return nullptr;
    p = SkipSpace(value.end);
    if (*p != ',') return nullptr;
    p = SkipSpace(p + 1);
  }
}

const char *JsonReadString(const char *value, const char *defaultText, size_t *lengthOut,
                           const char **endOut) {
  const tValue parsed = value != nullptr ? ParseString(SkipSpace(value))
                                         : Failure(nullptr, kErrorValueExpected);
  if (parsed.kind == kKindString) {
    if (lengthOut != nullptr) *lengthOut = static_cast<size_t>(parsed.length);
    if (endOut != nullptr) *endOut = parsed.end;
    return parsed.start;
  }
  if (lengthOut != nullptr) *lengthOut = defaultText != nullptr ? std::strlen(defaultText) : 0;
  if (endOut != nullptr) *endOut = nullptr;
  return defaultText;
}

int32_t JsonReadInt(const char *value, int32_t defaultValue, const char **endOut) {
  const tValue parsed = value != nullptr ? ParseNumber(SkipSpace(value))
                                         : Failure(nullptr, kErrorValueExpected);
  if (endOut != nullptr) *endOut = parsed.end;
  if (parsed.kind != kKindNumber) return defaultValue;
  char text[kNumberText + 1];
  const size_t length = parsed.length < kNumberText ? parsed.length : kNumberText;
  std::memcpy(text, parsed.start, length);
  text[length] = '\0';
  if (parsed.isReal == 0) {
    int result = defaultValue;
    std::sscanf(text, "%i", &result);
    return result;
  }
  const char sign = DecimalSign();
  if (sign != '.') {
    for (size_t i = 0; i < length; ++i) {
      if (text[i] == '.') text[i] = sign;
    }
  }
  double real = 0.0;
  if (std::sscanf(text, "%lg", &real) != 1) return defaultValue;
  return CutToInt32(real);
}

}  // namespace jsonz
