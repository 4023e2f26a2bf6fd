// Value and time pairs of every signal of a session, in flat regions: one run per signal, in list
// order, all runs of one length; one 32-bit pair count per signal.
//
// An input XY session (mode 2) hands out, for each signal, the pairs that reached it and no read
// has taken, oldest first, as many as its run holds. With a time limit (raw time) a read takes
// only the pairs stamped no later than the limit, and waits, while the clock is before the limit,
// until every run can be filled; the clock reaching the limit, or a clear of the session, ends
// the wait. Without a limit it never waits.
//
// An output XY session (mode 5) sends each pair in a frame stamped with the pair's time, or, when
// no timestamps are given, with the clock. Pairs of one frame group due at the same time share a
// frame. The time limit of a write is accepted and never needed.
#ifndef KVOR_SIM_SIGNAL_XY_H
#define KVOR_SIM_SIGNAL_XY_H

#include <cstdint>

#include "driver.h"
#include "driver_status.h"
#include "session.h"

namespace nKvorSim {

struct tXYRegions {
  double *values;
  uint32_t valuesSize;
  uint64_t *timestamps;
  uint32_t timestampsSize;
  uint32_t *numPairs;
  uint32_t numPairsSize;
};

Status ReadSignalXY(Driver &driver, Session &session, const uint64_t *timeLimit,
                    const tXYRegions &regions);

Status WriteSignalXY(Driver &driver, Session &session, double timeout, const tXYRegions &regions);

}  // namespace nKvorSim

#endif
