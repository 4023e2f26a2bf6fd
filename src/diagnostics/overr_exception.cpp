#include "diagnostics/overr_exception.h"

#include <cstring>

#include "diagnostics/jsonz.h"

namespace overr {

ExceptionBase::~ExceptionBase() = default;

Exception::Exception(const nKVSVAPI100::tJsonStatus &status) { CopyFrom(status); }

Exception::Exception(const Exception &other) : std::exception(other), ExceptionBase(other) {
  CopyFrom(other.status_);
}

Exception::~Exception() { nKVSVAPI100::ReleaseJsonStatus(status_); }

// The code always travels; the document only if a buffer of its own can be had for it.
void Exception::CopyFrom(const nKVSVAPI100::tJsonStatus &status) {
  status_.code = status.code;
  if (status.buffer == nullptr) return;
  if (nKVSVAPI100::ReserveJsonRoom(status_, std::strlen(status.buffer)) != nullptr) {
    jsonz::StoreDocument(status_.buffer, status_.capacity, status.buffer);
  }
}

const char *Exception::what() const noexcept { return Detail(); }

int32_t Exception::Code() const noexcept { return status_.code; }

const char *Exception::Detail() const noexcept {
  return status_.buffer != nullptr ? status_.buffer : "";
}

}  // namespace overr
