// The driver functions that this stand-in implements, by name: what a test may hold or make fail.
#ifndef KVOR_SIM_DRIVER_FUNCTIONS_H
#define KVOR_SIM_DRIVER_FUNCTIONS_H

#include <string_view>

namespace nKvorSim {

struct DriverFunction {
  const char *name;
  bool returnsStatus;  // a status can be injected into it
  bool takesProperty;  // its calls carry a property identifier
};

// The function of that exact name, or null.
const DriverFunction *FindDriverFunction(std::string_view name);

}  // namespace nKvorSim

#endif
