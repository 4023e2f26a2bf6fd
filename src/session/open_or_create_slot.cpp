#include "session/open_or_create_slot.h"

#include "kvsvplatform.h"
#include "session/open_project_session.h"

namespace nKVSVAPI100 {

Status OpenOrCreateSlot(cSnLifeManager &manager, SvHandle *nameRef, uint32_t *session, bool open,
                        const std::string &path, bool retry) {
  if (session == nullptr) return kvErrNullArgument;
  Status opened = 0;
  if (open) {
    opened = OpenProjectSession(manager, nameRef, session, path, retry);
    // The program learns of the failure at its first use of the session.
    if (opened < 0) kvhdnCreateErrorSession(opened, session);
  }
  const Status placed = CreateSlot(manager, *session, opened < 0 ? opened : 0);
  return opened < 0 ? opened : placed;
}

}  // namespace nKVSVAPI100
