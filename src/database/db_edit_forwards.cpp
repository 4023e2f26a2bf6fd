// Whole-database operations that need nothing of the library: each export hands its arguments to
// the driver as they are and returns the driver's status. They take no lock of the life manager,
// whose account of open texts a merge, save or alias does not change.
#include "kvsvapi.h"
#include "kvsvplatform.h"

extern "C" KVSV_EXPORT kvsvStatus kvsvdbMerge(uint32_t target, uint32_t source, uint32_t copyMode,
                                              const char *prefix, uint32_t waitForComplete,
                                              uint32_t *percentComplete) {
  return kvdbMerge(target, source, copyMode, prefix, waitForComplete, percentComplete);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbSave(uint32_t database, const char *filePath) {
  return kvdbSaveDatabase(database, filePath);
}

// Exporting writes the same file as saving.
extern "C" KVSV_EXPORT kvsvStatus kvsvdbExport(uint32_t database, const char *filePath) {
  return kvdbSaveDatabase(database, filePath);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbAddAlias(const char *alias, const char *filePath,
                                                 uint32_t defaultBaudRate) {
  return kvdbAddAlias(alias, filePath, defaultBaudRate);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbAddAlias64(const char *alias, const char *filePath,
                                                   uint64_t defaultBaudRate) {
  return kvdbAddAlias64(alias, filePath, defaultBaudRate);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbRemoveAlias(const char *alias) {
  return kvdbRemoveAlias(alias);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbDeploy(const char *ipAddress, const char *alias,
                                               uint32_t waitForComplete,
                                               uint32_t *percentComplete) {
  return kvdbDeploy(ipAddress, alias, waitForComplete, percentComplete);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbUndeploy(const char *ipAddress, const char *alias) {
  return kvdbUndeploy(ipAddress, alias);
}
