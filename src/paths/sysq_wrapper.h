// The locations special to the maker's software and to the user.
#ifndef KVSVAPI_PATHS_SYSQ_WRAPPER_H
#define KVSVAPI_PATHS_SYSQ_WRAPPER_H

#include <string>

namespace ovsysq {

// Each getter throws overr::Exception when its lookup fails. Only derived classes are made.
class SysqWrapper {
 public:
  virtual ~SysqWrapper();

  virtual std::string GetRunDir() const;          // "/var/run"
  virtual std::string GetLocalStateDir() const;   // "/var/local/orvane"
  virtual std::string GetSharedDir() const;       // the share directory
  virtual std::string GetShareDir() const;        // the same, by its other name
  virtual std::string GetTempDir() const;         // TMPDIR as it stands, else "/tmp"
  virtual std::string GetUserConfigDir(bool create) const;
  virtual std::string GetTempFileName() const;

 protected:
  SysqWrapper() = default;
  SysqWrapper(const SysqWrapper &) = default;
  SysqWrapper &operator=(const SysqWrapper &) = default;
};

}  // namespace ovsysq

#endif
