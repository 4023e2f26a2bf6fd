// Every test program but those of the log itself: the real log, which takes the reports that no
// fake takes, lives in a directory of the program's own, removed at exit, never in the system's
// error-log directory.
#include <exception>
#include <memory>

#include "diagnostics/error_log.h"
#include "support/temp_dir.h"

namespace {

struct tTestLogDirectory {
  tTestLogDirectory() {
    try {
      dir = std::make_unique<kvsvtest::cTempDir>();
    } catch (const std::exception &) {
      // Without a directory of its own the log is pointed at one that does not exist: rows drop.
    }
    nKVSVAPI100::SetErrorLogDirectoryForTests(dir ? dir->Path() : "/nonexistent/kvsv-test-log");
  }
  std::unique_ptr<kvsvtest::cTempDir> dir;
} gTestLogDirectory;

}  // namespace
