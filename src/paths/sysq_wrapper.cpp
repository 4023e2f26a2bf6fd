#include "paths/sysq_wrapper.h"

#include <cstdio>
#include <cstdlib>

#include "diagnostics/json_status_guard.h"
#include "paths/share_dir.h"
#include "paths/user_config_dir.h"

namespace ovsysq {

SysqWrapper::~SysqWrapper() = default;

std::string SysqWrapper::GetRunDir() const { return "/var/run"; }

std::string SysqWrapper::GetLocalStateDir() const { return "/var/local/orvane"; }

std::string SysqWrapper::GetSharedDir() const { return ReadShareDir(kShareDirFile); }

std::string SysqWrapper::GetShareDir() const { return ReadShareDir(kShareDirFile); }

std::string SysqWrapper::GetTempDir() const {
  const char *value = std::getenv("TMPDIR");
  return value != nullptr ? value : "/tmp";
}

std::string SysqWrapper::GetUserConfigDir(bool create) const {
  std::string dir;
  {
    // Leaving the scope with a failure throws it.
    nKVSVAPI100::cJsonStatusGuard guard;
    dir = UserConfigDir(create, guard.Status());
  }
  return dir;
}

std::string SysqWrapper::GetTempFileName() const {
  char name[L_tmpnam] = {0};
  return std::tmpnam(name) != nullptr ? name : "";
}

}  // namespace ovsysq
