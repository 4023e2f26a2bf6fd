// Sets the relocation of the test library (relocations/relocations.cpp) up at program start,
// before anything can build the directory table, and removes its root at exit.
#ifndef KVSVAPI_TESTS_PATHS_RELOCATION_ROOT_H
#define KVSVAPI_TESTS_PATHS_RELOCATION_ROOT_H

#include <stdlib.h>

#include <string>

#include "paths/paths_test_support.h"

namespace kvsvtest {

class cRelocationRoot {
 public:
  // `failingKey`, if given, is a key for which the relocation call fails.
  explicit cRelocationRoot(const char *failingKey = nullptr) {
    setenv("KVSV_TEST_RELOCATION_ROOT", root_.Path().c_str(), 1);
    if (failingKey != nullptr) setenv("KVSV_TEST_RELOCATION_FAIL", failingKey, 1);
  }
  const std::string &Path() const { return root_.Path(); }

 private:
  cTempDir root_;
};

}  // namespace kvsvtest

#endif
