// Which kind of process the host is: development environment, run-time engine, built application.
#ifndef SVHOST_RUN_MODE_H
#define SVHOST_RUN_MODE_H

namespace svhost {

// Back to a development environment: all flags 0.
void ResetRunMode();

}  // namespace svhost

#endif
