// The traffic of a pair: its writer sends stamped frames on CAN1 in batches of varying size, its
// reader takes them on CAN2 in batches of varying size with short time limits and checks each.
// Both use whatever session their end has now and carry on through the statuses of ended ones.
#ifndef KVSVAPI_STRESS_SOAK_TRAFFIC_H
#define KVSVAPI_STRESS_SOAK_TRAFFIC_H

#include <cstdint>
#include <vector>

#include "soak_pairs.h"
#include "soak_progress.h"

namespace nKvsvSoak {

void RunWriter(tPair &pair, const tRunFlags &flags, uint32_t seed, cSoakThread &thread);
void RunReader(tPair &pair, std::vector<tPair> &pairs, const tRunFlags &flags, uint32_t seed,
               cSoakThread &thread);

// Checks every frame a read left in `arrays`; `last` holds the last sequence number seen per
// writer on one session, or is null where the order cannot be known; `call` names the read in
// what is reported. Returns the frames.
uint64_t CheckFrames(const char *call, const class cReadArrays &arrays, bool flexibleReader,
                     std::vector<tPair> &pairs, std::vector<int64_t> *last, cSoakThread &thread);

}  // namespace nKvsvSoak

#endif
