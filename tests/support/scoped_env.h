// An environment variable set, or unset, for the length of a scope.
#ifndef KVSVAPI_TESTS_SCOPED_ENV_H
#define KVSVAPI_TESTS_SCOPED_ENV_H

#include <stdlib.h>

#include <optional>
#include <string>

namespace kvsvtest {

// Sets (or with nullopt unsets) an environment variable and restores it at the end of the scope.
class cScopedEnv {
 public:
  cScopedEnv(const char *name, const std::optional<std::string> &value) : name_(name) {
    if (const char *old = getenv(name)) old_ = old;
    Apply(value);
  }
  ~cScopedEnv() { Apply(old_); }
  cScopedEnv(const cScopedEnv &) = delete;
  cScopedEnv &operator=(const cScopedEnv &) = delete;

 private:
  void Apply(const std::optional<std::string> &value) {
    value ? setenv(name_.c_str(), value->c_str(), 1) : unsetenv(name_.c_str());
  }

  std::string name_;
  std::optional<std::string> old_;
};

}  // namespace kvsvtest

#endif
