// Temporary directories and scoped environment variables for the path tests.
#ifndef KVSVAPI_TESTS_PATHS_PATHS_TEST_SUPPORT_H
#define KVSVAPI_TESTS_PATHS_PATHS_TEST_SUPPORT_H

#include <stdlib.h>
#include <sys/stat.h>

#include <filesystem>
#include <fstream>
#include <optional>
#include <stdexcept>
#include <string>

namespace kvsvtest {

// A fresh directory under /tmp, removed with everything in it at the end of the scope.
class cTempDir {
 public:
  cTempDir() {
    char pattern[] = "/tmp/kvsv_paths_XXXXXX";
    if (mkdtemp(pattern) == nullptr) throw std::runtime_error("mkdtemp failed");
    path_ = pattern;
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

inline bool IsDirectory(const std::string &path) {
  struct stat info;
  return stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

// Sets (or with nullopt unsets) an environment variable and restores it at the end of the scope.
class cScopedEnv {
 public:
  cScopedEnv(const char *name, std::optional<std::string> value) : name_(name) {
    if (const char *old = getenv(name)) old_ = old;
    Apply(value);
  }
  ~cScopedEnv() { Apply(old_); }
  cScopedEnv(const cScopedEnv &) = delete;
  cScopedEnv &operator=(const cScopedEnv &) = delete;

 private:
  void Apply(const std::optional<std::string> &value) {
    if (value) {
      setenv(name_.c_str(), value->c_str(), 1);
    } else {
      unsetenv(name_.c_str());
    }
  }

  std::string name_;
  std::optional<std::string> old_;
};

}  // namespace kvsvtest

#endif
