// The one way of reporting what must never happen: a record in the error log, status 0xBFF63001.
#ifndef KVSVAPI_CORE_INTERNAL_ERROR_H
#define KVSVAPI_CORE_INTERNAL_ERROR_H

#include <cstdint>

#include "core/internal_status.h"
#include "core/status.h"
#include "core/status_block.h"

namespace nKVSVAPI100 {

// Where internal reports end up. The circular error log implements it.
class iErrorLog {
 public:
  virtual ~iErrorLog() = default;
  // Computes the public status of `value` with `base` and `mask` and, if the value is not empty,
  // writes one record for it.
  virtual Status Write(tInternalStatus &value, uint32_t base, uint32_t mask) = 0;
};

// Builds the log at the first report. It may set a negative code in `block`; an exception it
// throws is caught and recorded in `block` as well.
using tErrorLogInit = void (*)(tStatusBlock &block);
// Gives the log object, or null if there is none.
using tErrorLogGet = iErrorLog *(*)();

// Installs the log's builder and accessor; null for either means "no log".
void SetErrorLogProvider(tErrorLogInit init, tErrorLogGet get);

// The log object that reports are written to, or null.
iErrorLog *GetErrorLog();

// Forgets that the log was built, so that the next report runs the installed builder again. For a
// provider swapped in after reports have been made (tests install a fake log this way).
void ResetErrorLogInit();

// Always returns 0xBFF63001. Safe from any thread, with or without any lock of the library held.
Status ReportInternalError(uint32_t component, uint32_t file, uint32_t line, uint32_t info);

}  // namespace nKVSVAPI100

#endif
