// The settings of a project session entry that the driver takes after creation.
#ifndef KVSVAPI_SESSION_APPLY_SESSION_ENTRY_H
#define KVSVAPI_SESSION_APPLY_SESSION_ENTRY_H

#include <cstdint>

#include "core/status.h"
#include "session/session_file_entry.h"

namespace nKVSVAPI100 {

// Sets on the new session `handle`: the resample rate in modes 1 and 4; on a FlexRay interface
// the key slot, unless `extra` is 0; on a LIN interface the schedule `extra`, unless it is -1.
// Interfaces are told by their first letters, in any case. The result is the status of the last
// driver call made, `createStatus` if none was needed; the first failure ends it.
Status ApplySessionEntry(uint32_t handle, const tSessionEntry &entry, Status createStatus);

}  // namespace nKVSVAPI100

#endif
