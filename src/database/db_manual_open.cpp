// A program's own open of a database object by its text: the manual road.
#include "core/host_handles.h"
#include "core/status.h"
#include "database/db_life_manager.h"
#include "database/find_by_reference_string.h"
#include "kvsvapi.h"
#include "session/kvorutility.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvdbManualOpen(uint32_t objectClass, SvHandle name,
                                                   kvsvRefnum *reference) {
  if (!HasText(name)) return kvErrDbReferenceEmpty;
  cDbLifeManager &manager = GetDbLifeManager();
  tDbObject object{0, 0, objectClass, 0};
  // Found or not, the lookup leaves the manager locked for the add that follows.
  manager.FindByName(name, &object.object);
  const bool found = object.object != 0;
  Status opened = 0;
  if (!found) opened = OpenDbObjectByText(name, objectClass, &object.object, &object.database);
  const bool held = found || opened >= 0;
  // A failed open is registered as an error object, which the host's reference then carries.
  const Status added = manager.AddObject(name, object, opened, kDbOpenManual);

  const Status registered = RegisterReference(objectClass, name, object.object, reference);
  if (registered < 0 && held) {
    manager.ReleaseByName(name, object.object, nullptr);
    kvdbCloseDatabase(object.object, 0);
    return registered;
  }
  if (added < 0 && opened >= 0) return added;
  return opened;
}
