#include <cinttypes>
#include <cstdio>
#include <cstring>

#include "diagnostics/jsonz.h"

namespace jsonz {

namespace {

bool IsSpace(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

// The two-character escape of a byte, or 0 when it has none.
char ShortEscape(unsigned char c) {
  switch (c) {
    case '\b': return 'b';
    case '\t': return 't';
    case '\n': return 'n';
    case '\f': return 'f';
    case '\r': return 'r';
    case '"': return '"';
    case '\\': return '\\';
    default: return 0;
  }
}

bool NeedsLongEscape(unsigned char c) { return c < 0x20 || c == 0x7F; }

char *WriteEscaped(char *out, const char *text) {
  for (const unsigned char *p = reinterpret_cast<const unsigned char *>(text); *p != 0; ++p) {
    const char escape = ShortEscape(*p);
    if (escape != 0) {
      *out++ = '\\';
      *out++ = escape;
    } else if (NeedsLongEscape(*p)) {
      char unit[7];
      std::snprintf(unit, sizeof unit, "\\u%04x", *p);
      std::memcpy(out, unit, 6);
      out += 6;
    } else {
      *out++ = static_cast<char>(*p);
    }
  }
  return out;
}

// Whether the object or array whose bracket the cursor stands on has no member yet. A cursor on
// a comma stands behind a member.
bool ContainerEmpty(const char *cursor) {
  if (*cursor == '}' || *cursor == ']') {
    const char open = *cursor == '}' ? '{' : '[';
    const char *p = cursor - 1;
    while (IsSpace(*p)) --p;
    return *p == open;
  }
  if (*cursor == '{' || *cursor == '[') {
    const char close = *cursor == '{' ? '}' : ']';
    const char *p = cursor + 1;
    while (IsSpace(*p)) ++p;
    return *p == close;
  }
  return false;
}

// Opens a gap of `size` bytes for a member at the cursor, with the comma that a non-empty
// container needs. Returns where the member goes, or null when the zero bytes behind the
// document's NUL run into the sentinel first; nothing is moved then.
char *OpenGap(char *cursor, size_t size) {
  const bool empty = ContainerEmpty(cursor);
  const size_t extra = size + (empty ? 0 : 1);
  char *nul = cursor + std::strlen(cursor);
  for (size_t i = 1; i <= extra; ++i) {
    if (nul[i] != '\0') return nullptr;
  }
  const bool opening = *cursor == '{' || *cursor == '[';
  char *at = opening ? cursor + 1 : cursor;
  std::memmove(at + extra, at, static_cast<size_t>(nul - at) + 1);
  if (empty) return at;
  if (opening) {
    at[size] = ',';
    return at;
  }
  *at = ',';
  return at + 1;
}

// "key": followed by a value of `valueSize` bytes, which the caller writes at the returned place.
char *AddMember(char *cursor, const char *key, size_t valueSize, char **valueOut) {
  if (cursor == nullptr || key == nullptr) return nullptr;
  const size_t keySize = EscapedSize(key) + 3;
  char *member = OpenGap(cursor, keySize + valueSize);
  if (member == nullptr) return nullptr;
  char *out = member;
  *out++ = '"';
  out = WriteEscaped(out, key);
  *out++ = '"';
  *out++ = ':';
  *valueOut = out;
  return out + valueSize;
}

char *AddRaw(char *cursor, const char *key, const char *text) {
  const size_t size = std::strlen(text);
  char *value = nullptr;
  char *end = AddMember(cursor, key, size, &value);
  if (end != nullptr) std::memcpy(value, text, size);
  return end;
}

// Only a lack of room is retried: a missing key or value would fail again after any growth.
template <typename tAdd>
char *WithRetry(char *cursor, const char *key, const tRetry &retry, tAdd add) {
  if (key == nullptr) return nullptr;
  while (cursor != nullptr) {
    char *added = add(cursor);
    if (added != nullptr || retry.fn == nullptr) return added;
    cursor = retry.fn(cursor, retry.arg);
  }
  return nullptr;
}

}  // namespace

size_t EscapedSize(const char *text) {
  size_t size = 0;
  for (const unsigned char *p = reinterpret_cast<const unsigned char *>(text); *p != 0; ++p) {
    size += ShortEscape(*p) != 0 ? 2 : NeedsLongEscape(*p) ? 6 : 1;
  }
  return size;
}

char *AddString(char *cursor, const char *key, const char *value) {
  if (value == nullptr) return nullptr;
  char *text = nullptr;
  char *end = AddMember(cursor, key, EscapedSize(value) + 2, &text);
  if (end == nullptr) return nullptr;
  *text++ = '"';
  text = WriteEscaped(text, value);
  *text = '"';
  return end;
}

char *AddInt32(char *cursor, const char *key, int32_t value) {
  char text[16];
  std::snprintf(text, sizeof text, "%i", static_cast<int>(value));
  return AddRaw(cursor, key, text);
}

char *AddUint32(char *cursor, const char *key, uint32_t value) {
  char text[16];
  std::snprintf(text, sizeof text, "%u", static_cast<unsigned>(value));
  return AddRaw(cursor, key, text);
}

char *AddUint64(char *cursor, const char *key, uint64_t value) {
  char text[24];
  std::snprintf(text, sizeof text, "%" PRIu64, value);
  return AddRaw(cursor, key, text);
}

char *AddObject(char *cursor, const char *key) {
  char *end = AddRaw(cursor, key, "{}");
  return end == nullptr ? nullptr : end - 1;
}

char *LeaveObject(char *cursor) { return cursor == nullptr ? nullptr : cursor + 1; }

char *AddString(char *cursor, const char *key, const char *value, const tRetry &retry) {
  if (value == nullptr) return nullptr;
  return WithRetry(cursor, key, retry, [&](char *at) { return AddString(at, key, value); });
}

char *AddInt32(char *cursor, const char *key, int32_t value, const tRetry &retry) {
  return WithRetry(cursor, key, retry, [&](char *at) { return AddInt32(at, key, value); });
}

char *AddUint32(char *cursor, const char *key, uint32_t value, const tRetry &retry) {
  return WithRetry(cursor, key, retry, [&](char *at) { return AddUint32(at, key, value); });
}

char *AddUint64(char *cursor, const char *key, uint64_t value, const tRetry &retry) {
  return WithRetry(cursor, key, retry, [&](char *at) { return AddUint64(at, key, value); });
}

char *AddObject(char *cursor, const char *key, const tRetry &retry) {
  return WithRetry(cursor, key, retry, [&](char *at) { return AddObject(at, key); });
}

}  // namespace jsonz
