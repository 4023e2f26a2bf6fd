// The numeric kinds of the driver's directories, and the text names by which exports select them.
#ifndef KVSVAPI_PATHS_DIRECTORY_KIND_H
#define KVSVAPI_PATHS_DIRECTORY_KIND_H

#include <cstdint>
#include <string>

namespace kvpath {

// Kinds 0 to 16 are valid; only those named here can be reached from a text name.
enum eDirectoryKind : uint32_t {
  eAliasFileDir = 0,
  eDatabaseCacheDir = 1,
  eDatabaseEditorSettingsIniDir = 2,
  eErrorLogDir = 3,
  eTemporarySessionTextFileDir = 13,
  eDatabaseConfigDir = 14,
};

// One past the last valid kind.
constexpr uint32_t kDirectoryKindCount = 17;

// Exact, case-sensitive match against the six text names; anything else throws cExceptionBase
// (component 13, file 24, line 51).
uint32_t KindFromName(const std::string &name);

}  // namespace kvpath

#endif
