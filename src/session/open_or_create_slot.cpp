#include "session/open_or_create_slot.h"

namespace nKVSVAPI100 {

Status OpenOrCreateSlot(cSnLifeManager &manager, const uint32_t *session) {
  if (session == nullptr) return kvErrNullArgument;
  return CreateSlot(manager, *session, 0);
}

}  // namespace nKVSVAPI100
