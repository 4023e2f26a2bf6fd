// The last step of every creation of a session: its slot in the session table.
#ifndef KVSVAPI_SESSION_OPEN_OR_CREATE_SLOT_H
#define KVSVAPI_SESSION_OPEN_OR_CREATE_SLOT_H

#include <cstdint>

#include "core/status.h"
#include "session/session_manager.h"

namespace nKVSVAPI100 {

// Makes the slot of *session under the manager's mutex. 0xBFF63015 for a null `session`;
// 0xBFF63020 if its low 16 bits are 0 or above 8192.
Status OpenOrCreateSlot(cSnLifeManager &manager, const uint32_t *session);

}  // namespace nKVSVAPI100

#endif
