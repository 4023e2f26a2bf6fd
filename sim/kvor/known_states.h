// The states that kvReadState knows, each with its one size. The 24-byte time records belong to
// Ethernet sessions, whose times are 1 ns times.
#ifndef KVOR_SIM_KNOWN_STATES_H
#define KVOR_SIM_KNOWN_STATES_H

#include <cstdint>

#include "driver_status.h"

namespace nKvorSim {

// The size of the time record that kvReadStateTimeTrigger gives.
constexpr uint32_t kTimeRecordSize = 24;

// 0 if a session of `protocol` may read `stateId` with `size` bytes; kvsimErrUnknownState for an
// identifier the driver does not have, kvsimErrWrongProtocol for a time record outside Ethernet,
// kvsimErrInvalidArgument for any other size.
Status CheckStateRead(uint32_t protocol, uint32_t stateId, uint32_t size);

}  // namespace nKvorSim

#endif
