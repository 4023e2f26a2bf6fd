// Loading of shared libraries and their symbols, with a failure described in a tJsonStatus.
#ifndef KVSVAPI_DIAGNOSTICS_OVDYNLIB_H
#define KVSVAPI_DIAGNOSTICS_OVDYNLIB_H

#include "diagnostics/json_status.h"

namespace nKVSVAPI100 {

// dlopen with `flags`. Returns null without trying when `status` already holds an error; on
// failure sets -52005 with a detail document ("ovdynlib_debug" with the path, "internal_error"
// with the dlerror text).
void *ovdynlib_load(const char *fileName, int flags, tJsonStatus &status);
// dlsym, failing in the same way, with "ovdynlib_symbol" naming the symbol.
void *ovdynlib_symbol(void *handle, const char *name, tJsonStatus &status);
// dlclose and nothing more.
void ovdynlib_close(void *handle);

constexpr int32_t kOvdynlibFailed = -52005;

}  // namespace nKVSVAPI100

#endif
