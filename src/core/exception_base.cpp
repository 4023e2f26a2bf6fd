#include "core/exception_base.h"

#include <cstdio>

namespace nKVSVAPI100 {
namespace nENSPAN000 {

cExceptionBase::cExceptionBase(tSystemService, uint32_t component, uint32_t file, uint32_t line,
                               uint32_t info) {
  status_.SetSystemServiceFailure(component, file, line, info);
  FormatText();
}

cExceptionBase::cExceptionBase(tInternal, uint32_t component, uint32_t file, uint32_t line) {
  status_.SetInternalFailure(component, file, line);
  FormatText();
}

cExceptionBase::cExceptionBase(tUser, uint32_t component, uint32_t file, uint32_t line,
                               uint32_t code) {
  status_.SetUserFailure(component, file, line, code);
  FormatText();
}

cExceptionBase::~cExceptionBase() = default;

const char *cExceptionBase::what() const noexcept { return text_; }

tInternalStatus *cExceptionBase::Status() { return &status_; }

const tInternalStatus *cExceptionBase::Status() const { return &status_; }

void cExceptionBase::FormatText() {
  std::snprintf(text_, sizeof text_, "0x%08X", static_cast<unsigned>(status_.info));
}

}  // namespace nENSPAN000
}  // namespace nKVSVAPI100
