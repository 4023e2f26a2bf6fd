// The classic installation directories, one getter per entry of the directory table.
#ifndef KVSVAPI_PATHS_SYSQ_WRAPPER_LINUX_H
#define KVSVAPI_PATHS_SYSQ_WRAPPER_LINUX_H

#include <string>

namespace ovsysq {

// Each getter throws overr::Exception when its lookup fails, as every one does after a failed
// build of the table. Only derived classes are made.
class SysqWrapper_Linux {
 public:
  virtual ~SysqWrapper_Linux();

  virtual std::string GetPrefixDir() const;
  virtual std::string GetExecPrefixDir() const;
  virtual std::string GetBinDir() const;
  virtual std::string GetSbinDir() const;
  virtual std::string GetLibDir() const;
  virtual std::string GetLib32Dir() const;
  virtual std::string GetLib64Dir() const;
  virtual std::string GetNativeLibDir() const;
  virtual std::string GetMultiarchLibDir() const;
  virtual std::string GetLibexecDir() const;
  virtual std::string GetSharedStateDir() const;
  virtual std::string GetDataRootDir() const;
  virtual std::string GetDataDir() const;
  virtual std::string GetSysconfDir() const;
  // "localstatedir"; named apart from SysqWrapper::GetLocalStateDir, the maker's own.
  virtual std::string GetSystemLocalStateDir() const;
  virtual std::string GetRunStateDir() const;
  virtual std::string GetIncludeDir() const;
  virtual std::string GetDocDir() const;
  virtual std::string GetInitdDir() const;

 protected:
  SysqWrapper_Linux() = default;
  SysqWrapper_Linux(const SysqWrapper_Linux &) = default;
  SysqWrapper_Linux &operator=(const SysqWrapper_Linux &) = default;

 private:
  static std::string Lookup(const char *key);
};

}  // namespace ovsysq

#endif
