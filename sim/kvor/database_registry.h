// The databases that callers have open. Every database function finds its database here.
#ifndef KVOR_SIM_DATABASE_REGISTRY_H
#define KVOR_SIM_DATABASE_REGISTRY_H

#include <cstdint>

#include "driver_status.h"

namespace nKvorSim {

class DatabaseRegistry {
 public:
  // Closes the database of `handle`: this open of it, or every open if `closeAll` is not 0.
  Status Close(uint32_t handle, uint32_t closeAll);
};

}  // namespace nKvorSim

#endif
