// Turning an internal status into the status that an export returns.
#ifndef KVSVAPI_CORE_PUBLIC_STATUS_H
#define KVSVAPI_CORE_PUBLIC_STATUS_H

#include <cstdint>

#include "core/internal_status.h"
#include "core/status.h"

namespace nKVSVAPI100 {

// Empty value: 0. A user code of the family `base` (under `mask`) keeps its own low bits; anything
// else becomes the family's internal code (bit 0 set), and a user kind in `value` turns internal.
Status ToPublicStatus(tInternalStatus &value, uint32_t base, uint32_t mask);

}  // namespace nKVSVAPI100

#endif
