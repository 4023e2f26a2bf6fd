// A temporary directory with files in it, and scoped environment variables, as the driver
// stand-in's and the session tests use them.
#ifndef KVSVAPI_TESTS_PATHS_PATHS_TEST_SUPPORT_H
#define KVSVAPI_TESTS_PATHS_PATHS_TEST_SUPPORT_H

#include <stdlib.h>

#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <string>

#include "support/scoped_env.h"

namespace kvsvtest {

// A fresh directory under /tmp, removed with everything in it at the end of the scope.
class cTempDir {
 public:
  cTempDir() : path_("/tmp/kvsv_paths_XXXXXX") {
    if (mkdtemp(path_.data()) == nullptr) throw std::runtime_error("mkdtemp failed");
  }
  ~cTempDir() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  cTempDir(const cTempDir &) = delete;
  cTempDir &operator=(const cTempDir &) = delete;

  const std::string &Path() const { return path_; }
  std::string Sub(const std::string &relative) const { return path_ + "/" + relative; }
  void WriteFile(const std::string &relative, const std::string &content) const {
    std::ofstream(Sub(relative), std::ios::binary) << content;
  }

 private:
  std::string path_;
};

}  // namespace kvsvtest

#endif
