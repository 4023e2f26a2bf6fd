// The life manager's account as a host program sees it: its references and open databases.
#include "database/db_life_manager.h"
#include "kvsvapi.h"
#include "session/kvorutility.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvdbUnregisterWithSV(kvsvRefnum reference) {
  return UnregisterReference(reference);
}

extern "C" KVSV_EXPORT uint32_t kvsvGetNumOpenDatabases(void) {
  return GetDbLifeManager().GetNumDatabases();
}
