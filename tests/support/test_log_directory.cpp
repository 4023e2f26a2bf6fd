// Every test program but those of the log itself: the real log, which takes the reports that no
// fake takes, lives in a directory of the program's own, removed at exit, never in the system's
// error-log directory.
#include <stdlib.h>

#include <filesystem>
#include <string>
#include <system_error>

#include "diagnostics/error_log.h"

namespace {

struct tTestLogDirectory {
  tTestLogDirectory() {
    std::string pattern = (std::filesystem::temp_directory_path() / "kvsvlog.XXXXXX").string();
    if (mkdtemp(pattern.data()) != nullptr) path = pattern;
    // Without a directory of its own the log is pointed at one that does not exist: rows drop.
    nKVSVAPI100::SetErrorLogDirectoryForTests(path.empty() ? "/nonexistent/kvsv-test-log" : path);
  }
  ~tTestLogDirectory() {
    std::error_code ignored;
    if (!path.empty()) std::filesystem::remove_all(path, ignored);
  }
  std::string path;
} gTestLogDirectory;

}  // namespace
