// Scope-bound owner of a tJsonStatus that turns an error left in it into an overr::Exception.
#ifndef KVSVAPI_DIAGNOSTICS_JSON_STATUS_GUARD_H
#define KVSVAPI_DIAGNOSTICS_JSON_STATUS_GUARD_H

#include <boost/noncopyable.hpp>

#include "diagnostics/json_status.h"

namespace nKVSVAPI100 {

class cJsonStatusGuard : boost::noncopyable {
 public:
  cJsonStatusGuard() = default;
  // Ending with a negative code while no exception is in flight throws overr::Exception with a
  // copy of the status; the guard's own buffer is freed in every case.
  ~cJsonStatusGuard() noexcept(false);

  tJsonStatus &Status() { return status_; }

 private:
  tJsonStatus status_;
};

}  // namespace nKVSVAPI100

#endif
