// The driver's name and version as the error log's header shows them.
#ifndef KVSVAPI_DIAGNOSTICS_DRIVER_VERSION_H
#define KVSVAPI_DIAGNOSTICS_DRIVER_VERSION_H

#include <string>

namespace nKVSVAPI100 {

// "KVOR driver", and when the driver tells its version, a blank and major.minor.update, the phase
// letter (d, a, b, f, or '-') and the build. Opens and closes a system handle of the driver.
std::string DriverVersionLine();

}  // namespace nKVSVAPI100

#endif
