// The last step of every creation of a session: its slot in the session table.
#ifndef KVSVAPI_SESSION_OPEN_OR_CREATE_SLOT_H
#define KVSVAPI_SESSION_OPEN_OR_CREATE_SLOT_H

#include <cstdint>
#include <string>

#include "core/status.h"
#include "kvsvapi.h"
#include "session/session_manager.h"

namespace nKVSVAPI100 {

// Under the manager's mutex. With `open`, first opens the project session named by `*nameRef`
// from the file at `path` into *session (OpenProjectSession); a failed open leaves an error
// session there instead, which answers every use with the failure. Then makes the slot of
// *session; an error session gets one like any other.
// 0xBFF63015 for a null `session`, with nothing made. Otherwise the open's failure, whether or
// not a slot was made; else 0xBFF63020 if the handle's low 16 bits are 0 or above 8192, 0xBFF63010
// if the slot cannot be made, and 0 (a warning of the open is not passed on).
Status OpenOrCreateSlot(cSnLifeManager &manager, SvHandle *nameRef, uint32_t *session, bool open,
                        const std::string &path, bool retry);

}  // namespace nKVSVAPI100

#endif
