// Every test program but those of the log itself: the real log, which takes the reports that no
// fake takes, and the driver's configuration, where its database aliases are kept, live in a
// directory of the program's own, removed at exit; never in the system's error-log directory or
// the user's configuration.
#include <cstdlib>
#include <exception>
#include <memory>

#include "diagnostics/error_log.h"
#include "support/temp_dir.h"

namespace {

struct tTestDirectories {
  tTestDirectories() {
    try {
      dir = std::make_unique<kvsvtest::cTempDir>();
    } catch (const std::exception &) {
      // Without a directory of its own the log is pointed at one that does not exist: rows drop,
      // and so do aliases.
    }
    const std::string root = dir ? dir->Path() : "/nonexistent/kvsv-test";
    nKVSVAPI100::SetErrorLogDirectoryForTests(root);
    // Read by the driver at its first use of an alias, which comes after this.
    setenv("KVSIM_CONFIG_DIR", (root + "/driver-config").c_str(), 1);
  }
  std::unique_ptr<kvsvtest::cTempDir> dir;
} gTestDirectories;

}  // namespace
