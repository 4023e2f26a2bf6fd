// The texts of the driver's statuses.
#ifndef KVOR_SIM_DRIVER_STATUS_H
#define KVOR_SIM_DRIVER_STATUS_H

#include <cstdint>

namespace nKvorSim {

using Status = int32_t;

// Writes the text of `status` into `text`, cut to `size` - 1 bytes and NUL-terminated; a status
// that the driver does not know gets a generic text with its number. Size 0 writes nothing.
void WriteStatusText(Status status, uint32_t size, char *text);

}  // namespace nKvorSim

#endif
