// The name by which the host holds a device: its serial number, which does not change as its
// model name may.
#ifndef KVSVAPI_SESSION_DEVICE_REFERENCE_NAME_H
#define KVSVAPI_SESSION_DEVICE_REFERENCE_NAME_H

#include <cstdint>

#include "core/status.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// Reads the serial number of `device` and prints "___kvorDev#" and its complement in eight
// lower-case hex digits into the string handle `name`. A failed read is returned with `name` as it
// was; a failed print is 0xBFF63010. Otherwise the read's status.
Status ReadDeviceReferenceName(uint32_t device, SvHandle name);

}  // namespace nKVSVAPI100

#endif
