// The status word of every export, and the component and file numbers that internal reports carry.
#ifndef KVSVAPI_CORE_STATUS_H
#define KVSVAPI_CORE_STATUS_H

#include <cstdint>

#include "kvsvapi.h"

namespace nKVSVAPI100 {

// 0 success, negative error, positive warning (warnings only ever come from the driver).
using Status = int32_t;

// Component number of this library in internal reports.
constexpr uint32_t kComponentKvsvapi = 13;

// Source-file numbers of internal reports: they identify the failing module in the error log.
namespace nFile {
constexpr uint32_t kDatabaseExports = 2;
constexpr uint32_t kDatabaseProperties = 3;
constexpr uint32_t kSessionIo = 9;
constexpr uint32_t kSessionOpenClose = 10;
constexpr uint32_t kSessionFile = 11;
constexpr uint32_t kRunMode = 14;
constexpr uint32_t kUtility = 16;
constexpr uint32_t kDatabaseLife = 18;
constexpr uint32_t kPathExports = 24;
}  // namespace nFile

// A failed mutex construction leaves this code in the owner's status block.
constexpr int64_t kMutexInitFailed = -52003;

inline bool IsError(Status s) { return s < 0; }

}  // namespace nKVSVAPI100

#endif
