// The merge of one cluster into another: frames with their signals and subframes, ECUs, value
// tables and attribute definitions, under names that may take a prefix.
#ifndef KVOR_SIM_DATABASE_MERGE_H
#define KVOR_SIM_DATABASE_MERGE_H

#include <cstdint>
#include <functional>
#include <string>

#include "database_model.h"
#include "driver_status.h"

namespace nKvorSim {

// What to do with an object whose name the target has already.
enum class MergeMode : uint32_t { kReplace = 0, kKeepTarget = 1, kRefuse = 2 };

// Copies `source` into `target`. `prefix` goes before the name of every frame (so its PDU) and
// ECU copied, and before the node names that the copied frames and signals give. A frame whose
// identifier another frame of the target has, a name that the prefix makes no identifier, and in
// kRefuse mode any name found in both, fail with nothing copied. `removing` is told of each
// frame and ECU of the target before a copy replaces it.
Status MergeCluster(tCluster *target, const tCluster &source, MergeMode mode,
                    const std::string &prefix, const std::function<void(const void *)> &removing,
                    std::string *error);

}  // namespace nKvorSim

#endif
