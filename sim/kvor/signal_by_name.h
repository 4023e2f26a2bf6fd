// Values of signal sessions made without a database travel by signal name on their network (see
// network.h). A write of many values per signal leaves the last of each there.
#ifndef KVOR_SIM_SIGNAL_BY_NAME_H
#define KVOR_SIM_SIGNAL_BY_NAME_H

#include <cstdint>
#include <optional>
#include <vector>

#include "session_definition.h"

namespace nKvorSim {

// Publishes last[i] as the value of item i, for each item that has one, stamped `time`.
void PublishLast(const SessionDefinition &definition,
                 const std::vector<std::optional<double>> &last, uint64_t time);

}  // namespace nKvorSim

#endif
