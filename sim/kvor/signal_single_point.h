// Single-point signal access: the latest value of each signal in a session's list, taken from or
// put on the session's network.
#ifndef KVOR_SIM_SIGNAL_SINGLE_POINT_H
#define KVOR_SIM_SIGNAL_SINGLE_POINT_H

#include <cstdint>

#include "driver_status.h"
#include "session.h"

namespace nKvorSim {

// For input single-point sessions: one value per signal, and one timestamp per signal if
// `timestamps` is not null. Each buffer must hold 8 bytes per signal. A signal that has not
// arrived since the session was last flushed reads 0.0 at time 0.
Status ReadSignalSinglePoint(const Session &session, double *values, uint32_t valuesSize,
                             uint64_t *timestamps, uint32_t timestampsSize);

// For output single-point sessions: one value per signal, stamped with `now`. The buffer must
// hold 8 bytes per signal; bytes beyond are not looked at.
Status WriteSignalSinglePoint(const Session &session, const double *values, uint32_t valuesSize,
                              uint64_t now);

}  // namespace nKvorSim

#endif
