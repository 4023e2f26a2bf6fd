#include "paths/user_config_dir.h"

#include <pwd.h>
#include <unistd.h>

#include <cstdlib>

#include "paths/make_directory.h"
#include "paths/normalize_directory_text.h"

namespace ovsysq {

namespace {

constexpr std::size_t kPasswordBufferSize = 1024;

// HOME, or the home field of the user's password entry; false after a failed lookup.
bool HomeDirectory(std::string &home, tJsonStatus &status) {
  if (const char *value = std::getenv("HOME")) {
    home = value;
    return true;
  }
  struct passwd entry;
  struct passwd *found = nullptr;
  char buffer[kPasswordBufferSize];
  const int result = getpwuid_r(getuid(), &entry, buffer, sizeof buffer, &found);
  if (result != 0) {
    SetOsFault(status, kResourceNotFound, __FILE__, __LINE__, result, "getpwuid_r failed");
    return false;
  }
  // No entry for the user leaves no home: the configuration directory then hangs off the root.
  home = found != nullptr && found->pw_dir != nullptr ? found->pw_dir : "";
  return true;
}

}  // namespace

std::string UserConfigDir(bool create, tJsonStatus &status) {
  if (const char *xdg = std::getenv("XDG_CONFIG_HOME")) {
    std::string dir = xdg;
    NormalizeDirectoryText(dir);
    if (create) MakeDirectoryWithParents(dir, nullptr, status);
    return dir;
  }
  std::string dir;
  if (!HomeDirectory(dir, status)) return std::string();
  NormalizeDirectoryText(dir);
  dir += "/.config";
  if (create) MakeDirectory(dir, nullptr, status);
  return dir;
}

}  // namespace ovsysq
