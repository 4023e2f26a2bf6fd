#include "diagnostics/json_status_guard.h"

#include <exception>

#include "diagnostics/overr_exception.h"

namespace nKVSVAPI100 {

cJsonStatusGuard::~cJsonStatusGuard() noexcept(false) {
  if (status_.code < 0 && std::uncaught_exceptions() == 0) {
    overr::Exception error(status_);
    ReleaseJsonStatus(status_);
    throw error;
  }
  ReleaseJsonStatus(status_);
}

}  // namespace nKVSVAPI100
