#include "paths/sysq_wrapper_linux.h"

#include "diagnostics/json_status_guard.h"
#include "paths/directory_table.h"

namespace ovsysq {

SysqWrapper_Linux::~SysqWrapper_Linux() = default;

std::string SysqWrapper_Linux::Lookup(const char *key) {
  std::string value;
  {
    // Leaving the scope with a failure throws it.
    nKVSVAPI100::cJsonStatusGuard guard;
    value = LookupDirectory(key, guard.Status());
  }
  return value;
}

std::string SysqWrapper_Linux::GetPrefixDir() const { return Lookup("prefixdir"); }
std::string SysqWrapper_Linux::GetExecPrefixDir() const { return Lookup("execprefixdir"); }
std::string SysqWrapper_Linux::GetBinDir() const { return Lookup("bindir"); }
std::string SysqWrapper_Linux::GetSbinDir() const { return Lookup("sbindir"); }
std::string SysqWrapper_Linux::GetLibDir() const { return Lookup("libdir"); }
std::string SysqWrapper_Linux::GetLib32Dir() const { return Lookup("lib32dir"); }
std::string SysqWrapper_Linux::GetLib64Dir() const { return Lookup("lib64dir"); }
std::string SysqWrapper_Linux::GetNativeLibDir() const { return Lookup("nativelibdir"); }
std::string SysqWrapper_Linux::GetMultiarchLibDir() const { return Lookup("multiarchlibdir"); }
std::string SysqWrapper_Linux::GetLibexecDir() const { return Lookup("libexecdir"); }
std::string SysqWrapper_Linux::GetSharedStateDir() const { return Lookup("sharedstatedir"); }
std::string SysqWrapper_Linux::GetDataRootDir() const { return Lookup("datarootdir"); }
std::string SysqWrapper_Linux::GetDataDir() const { return Lookup("datadir"); }
std::string SysqWrapper_Linux::GetSysconfDir() const { return Lookup("sysconfdir"); }
std::string SysqWrapper_Linux::GetSystemLocalStateDir() const { return Lookup("localstatedir"); }
std::string SysqWrapper_Linux::GetRunStateDir() const { return Lookup("runstatedir"); }
std::string SysqWrapper_Linux::GetIncludeDir() const { return Lookup("includedir"); }
std::string SysqWrapper_Linux::GetDocDir() const { return Lookup("docdir"); }
std::string SysqWrapper_Linux::GetInitdDir() const { return Lookup("initddir"); }

}  // namespace ovsysq
