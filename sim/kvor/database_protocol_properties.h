// Properties that only FlexRay and LIN clusters, frames and ECUs have values for. LIN schedules
// and their entries are not among them: a caller can make those in any cluster.
#ifndef KVOR_SIM_DATABASE_PROTOCOL_PROPERTIES_H
#define KVOR_SIM_DATABASE_PROTOCOL_PROPERTIES_H

#include <cstdint>

namespace nKvorSim {

bool IsFlexRayOrLinProperty(uint32_t id);

}  // namespace nKvorSim

#endif
