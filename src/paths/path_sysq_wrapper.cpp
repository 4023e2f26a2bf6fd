#include "paths/path_sysq_wrapper.h"

#include "diagnostics/json_status_guard.h"
#include "paths/make_directory.h"

namespace kvpath {

void cSysqWrapper::CreateDirectoryPath(const std::string &path, int32_t *createdFlag) {
  // Leaving the scope with a failure throws it.
  nKVSVAPI100::cJsonStatusGuard guard;
  ovsysq::MakeDirectoryWithParents(path, createdFlag, guard.Status());
}

}  // namespace kvpath
