#include "paths/directory_kind.h"

#include "core/exception_base.h"
#include "core/status.h"

namespace kvpath {

namespace {

constexpr uint32_t kUnknownNameLine = 51;

struct tKindName {
  const char *name;
  uint32_t kind;
};

// The order in which names are compared; only the first match matters.
const tKindName kKindNames[] = {
    {"eDatabaseEditorSettingsIniDir", eDatabaseEditorSettingsIniDir},
    {"eErrorLogDir", eErrorLogDir},
    {"eTemporarySessionTextFileDir", eTemporarySessionTextFileDir},
    {"eDatabaseCacheDir", eDatabaseCacheDir},
    {"eAliasFileDir", eAliasFileDir},
    {"eDatabaseConfigDir", eDatabaseConfigDir},
};

}  // namespace

uint32_t KindFromName(const std::string &name) {
  for (const tKindName &entry : kKindNames) {
    if (name == entry.name) return entry.kind;
  }
  throw nKVSVAPI100::cExceptionBase(nKVSVAPI100::cExceptionBase::tInternal(),
                                    nKVSVAPI100::kComponentKvsvapi,
                                    nKVSVAPI100::nFile::kPathExports, kUnknownNameLine);
}

}  // namespace kvpath
