// A status with the source location of its first failure.
#ifndef KVSVAPI_CORE_INTERNAL_STATUS_H
#define KVSVAPI_CORE_INTERNAL_STATUS_H

#include <cstdint>

namespace nKVSVAPI100 {

// `location`: bit 31 failed, 26-30 component, 16-25 file, 14-15 kind, 0-13 line.
struct tInternalStatus {
  enum eKind : uint32_t { kEmpty = 0, kUser = 1, kInternal = 2, kSystemService = 3 };

  uint32_t info = 0;
  uint32_t location = 0;

  // Setters never overwrite a value whose failed flag is already set: the first failure stays.
  void SetSystemServiceFailure(uint32_t component, uint32_t file, uint32_t line, uint32_t info);
  void SetInternalFailure(uint32_t component, uint32_t file, uint32_t line);
  void SetUserFailure(uint32_t component, uint32_t file, uint32_t line, uint32_t code);

  bool Failed() const { return (location >> 31) != 0; }
  uint32_t Kind() const { return (location >> 14) & 3u; }
  uint32_t Component() const { return (location >> 26) & 0x1Fu; }
  uint32_t File() const { return (location >> 16) & 0x3FFu; }
  uint32_t Line() const { return location & 0x3FFFu; }
  void SetKind(uint32_t kind) { location = (location & ~(3u << 14)) | ((kind & 3u) << 14); }
};

static_assert(sizeof(tInternalStatus) == 8, "internal status is two words");

// Kind names as the error log writes them; severity 1 for user, 2 otherwise.
const char *KindName(uint32_t kind);
uint32_t KindSeverity(uint32_t kind);

}  // namespace nKVSVAPI100

#endif
