// A status code with a JSON document that says in detail what went wrong.
#ifndef KVSVAPI_DIAGNOSTICS_JSON_STATUS_H
#define KVSVAPI_DIAGNOSTICS_JSON_STATUS_H

#include <cstddef>
#include <cstdint>

namespace nKVSVAPI100 {

struct tJsonStatus;

// Makes `status->buffer` at least `size` bytes, keeping the document; size 0 frees the buffer.
// Returns false, leaving the status untouched, when it cannot.
using tJsonGrow = bool (*)(tJsonStatus *status, size_t size);

// The heap grower: requests up to 512 bytes get 512, larger ones the next power of two, requests
// from 2^31 on fail. A new buffer starts with the old document, or "{}" when there was none.
bool GrowJsonStatusBuffer(tJsonStatus *status, size_t size);

// `buffer` holds one NUL-terminated JSON document, then zero bytes, and in its last byte the
// sentinel 'J' (kJsonSentinel): the distance from the NUL to the 'J' is the free room.
struct tJsonStatus {
  int32_t code = 0;          // 0, or a status; negative is an error
  uint32_t capacity = 0;     // size of `buffer` in bytes
  tJsonGrow grow = &GrowJsonStatusBuffer;
  char *buffer = nullptr;
};

constexpr char kJsonSentinel = 'J';

// Worst-of rule: 0 accepts any non-zero code, a positive code only a negative one, a negative code
// stays. An accepted code resets a present document to "{}". Returns whether `code` was accepted.
bool SetJsonStatus(tJsonStatus &status, int32_t code);

// Makes sure that a member of `n` bytes can be added. Returns a cursor on the document's closing
// bracket, or null when n is above 0x7FFFFFFD or the buffer cannot grow to n + 2 bytes.
char *ReserveJsonRoom(tJsonStatus &status, size_t n);

// Sets target's code to source's, then takes source's buffer over when both have the same grow
// function (source is left without a buffer), or else copies the document. `keptOut`, if given,
// tells whether target now holds source's document.
void MoveJsonStatus(tJsonStatus &target, tJsonStatus &source, bool *keptOut);

// Records a failure as the library describes its own errors: sets `code` by the worst-of rule and,
// if it was accepted, writes "error_constant", "file", "line" and "component" ("kvsvapi"). Returns
// a cursor on the document's closing brace for further members, or null when the code was refused
// or no room could be made.
char *SetJsonStatusError(tJsonStatus &status, int32_t code, const char *errorConstant,
                         const char *file, uint32_t line);

// A retry function for the writer's retrying adds (jsonz::tRetry) with a tJsonStatus* as its
// argument: doubles the buffer and returns the cursor moved into the new buffer, or null.
char *GrowJsonStatusRetry(char *cursor, void *status);

// Frees the buffer through `grow`.
void ReleaseJsonStatus(tJsonStatus &status);

}  // namespace nKVSVAPI100

#endif
