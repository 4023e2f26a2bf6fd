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

}  // namespace nKvsvSoak

#endif
