#include "diagnostics/json_status.h"

#include <cstdlib>
#include <cstring>

#include "diagnostics/jsonz.h"

namespace nKVSVAPI100 {

namespace {

constexpr size_t kMinimumBuffer = 512;
constexpr size_t kBufferLimit = size_t{1} << 31;
// Largest member that a reservation may ask for: with the two bytes of "{}" it still stays below
// the buffer limit.
constexpr size_t kLargestReservation = 0x7FFFFFFD;

size_t RoundedSize(size_t size) {
  if (size <= kMinimumBuffer) return kMinimumBuffer;
  size_t rounded = kMinimumBuffer;
  while (rounded < size) rounded <<= 1;
  return rounded;
}

// The members that start every error document of the library.
constexpr size_t kErrorHeaderGuess = 160;

}  // namespace

bool GrowJsonStatusBuffer(tJsonStatus *status, size_t size) {
  if (size == 0) {
    std::free(status->buffer);
    status->buffer = nullptr;
    status->capacity = 0;
    return true;
  }
  if (size >= kBufferLimit) return false;
  if (status->buffer != nullptr && status->capacity >= size) return true;
  const size_t rounded = RoundedSize(size);
  char *block = static_cast<char *>(std::malloc(rounded));
  if (block == nullptr) return false;
  if (jsonz::StoreDocument(block, rounded, status->buffer != nullptr ? status->buffer : "{}") ==
      nullptr) {
    std::free(block);
    return false;
  }
  std::free(status->buffer);
  status->buffer = block;
  status->capacity = static_cast<uint32_t>(rounded);
  return true;
}

bool SetJsonStatus(tJsonStatus &status, int32_t code) {
  const bool accepted = code != 0 && (status.code == 0 || (status.code > 0 && code < 0));
  if (!accepted) return false;
  status.code = code;
  if (status.buffer != nullptr) jsonz::StoreDocument(status.buffer, status.capacity, "{}");
  return true;
}

char *ReserveJsonRoom(tJsonStatus &status, size_t n) {
  if (n > kLargestReservation) return nullptr;
  if (status.buffer == nullptr || n + 2 > status.capacity) {
    if (status.grow == nullptr || !status.grow(&status, n + 2)) return nullptr;
    if (status.buffer == nullptr) return nullptr;
  }
  const size_t length = std::strlen(status.buffer);
  return length == 0 ? nullptr : status.buffer + length - 1;
}

void MoveJsonStatus(tJsonStatus &target, tJsonStatus &source, bool *keptOut) {
  target.code = source.code;
  bool kept = true;
  if (target.grow == source.grow) {
    if (target.buffer != source.buffer) {
      ReleaseJsonStatus(target);
      target.buffer = source.buffer;
      target.capacity = source.capacity;
      source.buffer = nullptr;
      source.capacity = 0;
    }
  } else if (source.buffer != nullptr) {
    kept = ReserveJsonRoom(target, std::strlen(source.buffer)) != nullptr &&
           jsonz::StoreDocument(target.buffer, target.capacity, source.buffer) != nullptr;
  } else if (target.buffer != nullptr) {
    jsonz::StoreDocument(target.buffer, target.capacity, "{}");
  }
  if (keptOut != nullptr) *keptOut = kept;
}

char *SetJsonStatusError(tJsonStatus &status, int32_t code, const char *errorConstant,
                         const char *file, uint32_t line) {
  if (!SetJsonStatus(status, code)) return nullptr;
  char *cursor = ReserveJsonRoom(status, kErrorHeaderGuess);
  const jsonz::tRetry retry{&GrowJsonStatusRetry, &status};
  cursor = jsonz::AddString(cursor, "error_constant", errorConstant, retry);
  cursor = jsonz::AddString(cursor, "file", file, retry);
  cursor = jsonz::AddUint32(cursor, "line", line, retry);
  return jsonz::AddString(cursor, "component", "kvsvapi", retry);
}

char *GrowJsonStatusRetry(char *cursor, void *arg) {
  tJsonStatus *status = static_cast<tJsonStatus *>(arg);
  if (cursor == nullptr || status->buffer == nullptr || status->grow == nullptr) return nullptr;
  const size_t offset = static_cast<size_t>(cursor - status->buffer);
  const size_t larger = status->capacity == 0 ? kMinimumBuffer : size_t{status->capacity} * 2;
  if (!status->grow(status, larger) || status->capacity < larger) return nullptr;
  return status->buffer + offset;
}

void ReleaseJsonStatus(tJsonStatus &status) {
  if (status.grow != nullptr) {
    status.grow(&status, 0);
  }
}

}  // namespace nKVSVAPI100
