#include "core/internal_status.h"

namespace nKVSVAPI100 {

namespace {

// Every field is cut to its width so that a stray number cannot spill into its neighbour.
uint32_t FailedLocation(uint32_t component, uint32_t file, uint32_t kind, uint32_t line) {
  return (1u << 31) | ((component & 0x1Fu) << 26) | ((file & 0x3FFu) << 16) | ((kind & 3u) << 14) |
         (line & 0x3FFFu);
}

}  // namespace

void tInternalStatus::SetSystemServiceFailure(uint32_t component, uint32_t file, uint32_t line,
                                              uint32_t number) {
  if (Failed()) return;
  location = FailedLocation(component, file, kSystemService, line);
  info = number;
}

void tInternalStatus::SetInternalFailure(uint32_t component, uint32_t file, uint32_t line) {
  if (Failed()) return;
  location = FailedLocation(component, file, kInternal, line);
  info = 1;
}

void tInternalStatus::SetUserFailure(uint32_t component, uint32_t file, uint32_t line,
                                     uint32_t code) {
  if (Failed()) return;
  location = FailedLocation(component, file, kUser, line);
  info = code;
}

const char *KindName(uint32_t kind) {
  switch (kind) {
    case tInternalStatus::kUser:
      return "User";
    case tInternalStatus::kInternal:
      return "Internal";
    case tInternalStatus::kSystemService:
      return "System Service";
    default:
      return "";
  }
}

uint32_t KindSeverity(uint32_t kind) { return kind == tInternalStatus::kUser ? 1u : 2u; }

}  // namespace nKVSVAPI100
