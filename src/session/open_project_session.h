// Opening a project session by its name in the project session file.
#ifndef KVSVAPI_SESSION_OPEN_PROJECT_SESSION_H
#define KVSVAPI_SESSION_OPEN_PROJECT_SESSION_H

#include <cstdint>
#include <string>

#include "core/status.h"
#include "kvsvapi.h"
#include "session/session_manager.h"

namespace nKVSVAPI100 {

// The first open on an interface creates the session of `*nameRef` from the file at `path` and,
// at once, every sibling of it in the file (same interface without its "/suffix", database and
// cluster), and records them in an interface record. Later opens claim what that open made. A
// sibling whose creation failed keeps its status for the first open of its name. With `retry` a
// refused first creation is tried again for about 8 seconds. Runs under the manager's mutex.
//
// `*sessionOut` is 0 unless the open succeeds. 0xBFF63166: no name. 0xBFF6309C: the name of a
// manually created session. 0xBFF63092: no file or no entry. 0xBFF63161: the interface record
// belongs to another tag. 0xBFF63162: the interface has a record, and the name is not among its
// sessions. 0xBFF63093: the session is claimed or closed already. Otherwise a status of the file
// readers or of the driver. A warning of the creation is returned with the session.
Status OpenProjectSession(cSnLifeManager &manager, SvHandle *nameRef, uint32_t *sessionOut,
                          const std::string &path, bool retry);

}  // namespace nKVSVAPI100

#endif
