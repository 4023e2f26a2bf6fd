// Clean-up procedures that the running program registered, to be run when it stops.
#ifndef SVHOST_CLEANUPS_H
#define SVHOST_CLEANUPS_H

#include <cstdint>
#include <vector>

#include "kvsvplatform.h"

namespace svhost {

struct Cleanup {
  SvCleanupProc procedure = nullptr;
  uint64_t argument = 0;
  int32_t mode = 0;
};

// Removes the pending procedures and gives them in order of registration.
std::vector<Cleanup> TakePendingCleanups();

// Forgets the pending procedures, the count of registrations and the last one.
void ResetCleanups();

}  // namespace svhost

#endif
