// JSON written and read in place in one flat buffer (see tJsonStatus for its layout): no tree, no
// nodes, no allocation except through the caller's grow function.
#ifndef KVSVAPI_DIAGNOSTICS_JSONZ_H
#define KVSVAPI_DIAGNOSTICS_JSONZ_H

#include <cstddef>
#include <cstdint>

namespace jsonz {

// Store step: puts `text` into a buffer of `size` bytes in the sentinel layout. Fails (null) when
// the text with its NUL does not fit with one byte to spare for the 'J'. A null `text` keeps the
// present document and rewrites the tail. Returns a pointer to the document's last character.
char *StoreDocument(char *buffer, size_t size, const char *text);

// ---- Writer. A cursor stands inside an object: on its opening or closing brace, or on the comma
// behind a member. Each add returns the cursor just behind the new member, so that adds chain in
// order, or null when no room is left; a null cursor gives null at once, so that a chain needs
// one test at its end. A failed add changes nothing.

// Called when room runs out: must grow the buffer and return the cursor in the grown buffer, or
// null to give up.
struct tRetry {
  char *(*fn)(char *cursor, void *arg) = nullptr;
  void *arg = nullptr;
};

char *AddString(char *cursor, const char *key, const char *value);
char *AddInt32(char *cursor, const char *key, int32_t value);
char *AddUint32(char *cursor, const char *key, uint32_t value);
char *AddUint64(char *cursor, const char *key, uint64_t value);
// Adds "key":{} and returns a cursor on the new object's closing brace.
char *AddObject(char *cursor, const char *key);
// Moves from an object's closing brace to the place behind it.
char *LeaveObject(char *cursor);

char *AddString(char *cursor, const char *key, const char *value, const tRetry &retry);
char *AddInt32(char *cursor, const char *key, int32_t value, const tRetry &retry);
char *AddUint32(char *cursor, const char *key, uint32_t value, const tRetry &retry);
char *AddUint64(char *cursor, const char *key, uint64_t value, const tRetry &retry);
char *AddObject(char *cursor, const char *key, const tRetry &retry);

// Bytes that `text` takes once escaped, without quotes.
size_t EscapedSize(const char *text);

// ---- Reader. Text is read up to its NUL and never beyond.

enum eError : uint32_t {
  kErrorNone = 0,
  kErrorValueExpected = 1,   // null text, or no value where one must stand
  kErrorString = 2,          // no opening or closing quote
  kErrorObject = 3,          // no '{', or the text ends inside the object
  kErrorArray = 4,           // no '[', or the text ends inside the array
  kErrorColonExpected = 5,
  kErrorCommaExpected = 6,
  kErrorEscape = 7,          // bad escape, or a control character inside a string
  kErrorTrailingComma = 8,
  kErrorTrailingChar = 9,    // text behind a whole document
};

// The constant name of an error code, or "unknown".
const char *ErrorName(uint32_t code);

enum eKind : uint32_t {
  kKindError = 0,
  kKindNull = 1,
  kKindBoolean = 2,
  kKindNumber = 3,
  kKindString = 4,
  kKindArray = 5,
  kKindObject = 6,
};

struct tValue {
  uint32_t kind = kKindError;
  // Where the value starts (for a string: behind its opening quote); for an error, where parsing
  // failed.
  const char *start = nullptr;
  // Length in bytes of a string (raw, still escaped) or number; the error code of an error; the
  // value (0 or 1) of a boolean.
  uint64_t length = 0;
  uint32_t isReal = 0;       // a number with a fraction or exponent
  const char *end = nullptr; // behind the value; null for an error
};

// Parses one value, white space before it allowed. Of failing parses the one that got farthest
// is kept.
tValue ParseValue(const char *text);
// Parses one value that must be the whole text, white space around it allowed.
tValue ParseDocument(const char *text);

// The value of the first member named `key` (compared unescaped) of the object at `object`, or
// null.
const char *JsonFindKey(const char *object, const char *key);
// A string's raw, still escaped text and its length; otherwise `defaultText`, its strlen and a
// null end.
const char *JsonReadString(const char *value, const char *defaultText, size_t *lengthOut,
                           const char **endOut);
// A number as a 32-bit integer (a real one cut); otherwise `defaultValue` and a null end.
int32_t JsonReadInt(const char *value, int32_t defaultValue, const char **endOut);
// Decodes `length` bytes of escaped string text into `target`, which needs length + 1 bytes, and
// NUL-terminates it. Returns the terminating NUL, or null on a bad escape.
char *JsonUnescape(const char *text, size_t length, char *target);

}  // namespace jsonz

#endif
