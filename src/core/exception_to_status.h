// Classifying the active exception inside a catch-all.
#ifndef KVSVAPI_CORE_EXCEPTION_TO_STATUS_H
#define KVSVAPI_CORE_EXCEPTION_TO_STATUS_H

#include "core/status.h"

namespace nKVSVAPI100 {

// Run-mode form: cExceptionBase is reported (file 14, line 154) and gives 0xBFF63001; out of
// memory gives 0xBFF63010; another standard exception is reported (file 14, line 162); anything
// else is rethrown.
Status ExceptionToStatusRunMode();

// Path-export form: cExceptionBase through ToPublicStatus(0x3FF63000, 0x7FFFFC00); out of memory
// 0xBFF63010; anything else 0xBFF63001 with no report.
Status ExceptionToStatusPath();

}  // namespace nKVSVAPI100

#endif
