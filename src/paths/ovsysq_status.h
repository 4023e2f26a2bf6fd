// The status codes of the standard-directory layer and the detail of an operating system failure.
#ifndef KVSVAPI_PATHS_OVSYSQ_STATUS_H
#define KVSVAPI_PATHS_OVSYSQ_STATUS_H

#include <cstdint>

#include "diagnostics/json_status.h"
#include "diagnostics/jsonz.h"

namespace ovsysq {

using nKVSVAPI100::tJsonStatus;

constexpr int32_t kMemoryFull = -52000;             // "ovapalerr_memoryFull"
constexpr int32_t kResourceNotFound = -52006;       // "ovapalerr_resourceNotFound"
constexpr int32_t kOsFault = -52008;                // "ovapalerr_osFault"
constexpr int32_t kObjectNameCollision = -52013;    // "ovapalerr_objectNameCollision"

// The constant name of one of the codes above.
const char *ErrorConstant(int32_t code);

// Sets `code` by the worst-of rule and, if it was taken, writes the location, an "internal_error"
// object for `errnoValue` and an "ovsysq_debug" object holding `desc`. Returns a cursor inside
// "ovsysq_debug" for the operation's own keys, or null when the code was refused or no room could
// be made (the writer then ignores further adds).
char *SetOsFault(tJsonStatus &status, int32_t code, const char *file, uint32_t line,
                 int errnoValue, const char *desc);

// Growing retry for adds to `status`'s document.
jsonz::tRetry RetryFor(tJsonStatus &status);

}  // namespace ovsysq

#endif
