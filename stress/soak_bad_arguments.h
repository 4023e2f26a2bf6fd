// The thread that calls exports with what a careless program passes: null pointers, ended
// sessions, handles of other classes, empty and oversized arrays. Each call must come back with
// a status; the ones whose status is certain must give it.
#ifndef KVSVAPI_STRESS_SOAK_BAD_ARGUMENTS_H
#define KVSVAPI_STRESS_SOAK_BAD_ARGUMENTS_H

#include <cstdint>
#include <vector>

#include "soak_pairs.h"
#include "soak_progress.h"

namespace nKvsvSoak {

void RunBadArguments(std::vector<tPair> &pairs, const tRunFlags &flags, uint32_t seed,
                     cSoakThread &thread);

// Whether a handle of another class that this thread passes (a device, an interface, a database
// object) reaches the slot of `session`. The library finds a session's slot by the low 16 bits of
// a number alone, so a call with such a handle acts on that slot as its program's own: the pairs
// keep their traffic off these slots, as a program must keep its sessions' numbers to itself.
bool ReachedByStrangers(uint32_t session);

}  // namespace nKvsvSoak

#endif
