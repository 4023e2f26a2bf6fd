// Sets the relocation of the test library (relocations/relocations.cpp) up at program start,
// before anything can build the directory table, and removes its root at exit.
#ifndef KVSVAPI_TESTS_PATHS_RELOCATION_ROOT_H
#define KVSVAPI_TESTS_PATHS_RELOCATION_ROOT_H

#include <stdlib.h>

#include <optional>
#include <string>

#include "paths/paths_test_support.h"

namespace kvsvtest {

class cRelocationRoot {
 public:
  // `failingKey`, if given, is a key for which the relocation call fails. The test files of one
  // program share the root that the first of them made.
  explicit cRelocationRoot(const char *failingKey = nullptr) {
    if (const char *made = getenv("KVSV_TEST_RELOCATION_ROOT")) {
      path_ = made;
    } else {
      root_.emplace();
      path_ = root_->Path();
      setenv("KVSV_TEST_RELOCATION_ROOT", path_.c_str(), 1);
    }
    if (failingKey != nullptr) setenv("KVSV_TEST_RELOCATION_FAIL", failingKey, 1);
  }
  const std::string &Path() const { return path_; }

 private:
  std::optional<cTempDir> root_;
  std::string path_;
};

}  // namespace kvsvtest

#endif
