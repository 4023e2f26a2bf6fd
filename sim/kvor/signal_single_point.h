// Single-point signal access: the latest value of each signal in a session's list. A session
// made with a database takes its values from the frames that reach it and puts them on the bus in
// frames; one made without takes and puts them on its network by name.
#ifndef KVOR_SIM_SIGNAL_SINGLE_POINT_H
#define KVOR_SIM_SIGNAL_SINGLE_POINT_H

#include <cstdint>

#include "driver.h"
#include "driver_status.h"
#include "session.h"

namespace nKvorSim {

// For input single-point sessions, and for every signal input session made with a database: one
// value per signal, and one timestamp per signal if `timestamps` is not null. Each buffer must
// hold 8 bytes per signal. A signal that has not arrived since the session was last flushed
// reads 0.0 at time 0.
Status ReadSignalSinglePoint(Session &session, uint64_t now, double *values, uint32_t valuesSize,
                             uint64_t *timestamps, uint32_t timestampsSize);

// For output single-point sessions: one value per signal, stamped with the clock; with a
// database, one frame per frame group of the list goes on the bus at once. The buffer must hold
// 8 bytes per signal; bytes beyond are not looked at.
Status WriteSignalSinglePoint(Driver &driver, Session &session, const double *values,
                              uint32_t valuesSize);

}  // namespace nKvorSim

#endif
