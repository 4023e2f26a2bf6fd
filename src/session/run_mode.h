// How the host runs: a built application, or a development environment.
#ifndef KVSVAPI_SESSION_RUN_MODE_H
#define KVSVAPI_SESSION_RUN_MODE_H

#include "core/status.h"

namespace nKVSVAPI100 {

// True in a built application: a bound application under a run-time engine, full-featured or
// not. Only there does a project open retry, and only there does the project file lie beside
// the application. Asks the host afresh at each call. Always 0.
Status GetRunMode(bool &isBuilt);

}  // namespace nKVSVAPI100

#endif
