// The end of a session: out of its interface record and the driver, then out of the slot table.
#ifndef KVSVAPI_SESSION_TEARDOWN_SLOT_H
#define KVSVAPI_SESSION_TEARDOWN_SLOT_H

#include <cstdint>

#include "core/status.h"
#include "session/session_manager.h"

namespace nKVSVAPI100 {

// Clears the session in the driver and, when no claimed sibling remains, its unclaimed siblings
// and its interface record. Sessions of no record are only cleared.
Status CloseProjectSession(cSnLifeManager &manager, uint32_t handle);

// Closes the session, empties its slot, waits up to 100 seconds for calls still holding a guard
// and frees the slot. The driver session goes first, so that a call blocked on it comes back.
Status TeardownSlot(cSnLifeManager &manager, uint32_t handle);

}  // namespace nKVSVAPI100

#endif
