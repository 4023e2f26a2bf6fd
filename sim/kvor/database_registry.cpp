#include "database_registry.h"

#include "kvsim.h"

namespace nKvorSim {

// The stand-in has no database engine, so no call opens a database and no handle names an open
// one: every close is refused.
Status DatabaseRegistry::Close(uint32_t, uint32_t) { return kvsimErrInvalidDatabase; }

}  // namespace nKvorSim
