// The one object through which a path reaches the standard directories of both kinds.
#ifndef KVSVAPI_PATHS_PATH_SYSQ_WRAPPER_H
#define KVSVAPI_PATHS_PATH_SYSQ_WRAPPER_H

#include <cstdint>
#include <string>

#include "paths/sysq_wrapper.h"
#include "paths/sysq_wrapper_linux.h"

namespace kvpath {

// Holds nothing, so making one costs nothing.
class cSysqWrapper : public ovsysq::SysqWrapper, public ovsysq::SysqWrapper_Linux {
 public:
  cSysqWrapper() = default;

  // Makes `path` with its missing parents; folds the created flags into `createdFlag` (may be
  // null). Throws overr::Exception on failure.
  virtual void CreateDirectoryPath(const std::string &path, int32_t *createdFlag);
};

}  // namespace kvpath

#endif
