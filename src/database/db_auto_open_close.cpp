// The host's own open and close of a database object's reference, by its text: the automatic
// road. A failed open still gives a handle, an error object that carries the failure to the first
// use of the reference.
#include "core/host_handles.h"
#include "core/status.h"
#include "database/db_life_manager.h"
#include "database/find_by_reference_string.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

namespace {

bool HasText(const SvHandle *name) { return name != nullptr && nKVSVAPI100::HasText(*name); }

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvdbAutoOpenDbObject(SvHandle *name, uint32_t objectClass,
                                                         uint32_t *handleOut,
                                                         uint64_t /*context*/) {
  if (handleOut == nullptr) return kvErrNullArgument;
  *handleOut = 0;
  if (!HasText(name)) {
    kvhdndbCreateErrorObject(kvErrDbReferenceEmpty, handleOut);
    return kvErrDbReferenceEmpty;
  }
  cDbLifeManager &manager = GetDbLifeManager();
  tDbObject object{0, 0, objectClass, 0};
  const Status looked = manager.FindByName(*name, &object.object);
  if (looked < 0) {
    tDbObject nothing;
    manager.AddObject(nullptr, nothing, looked, kDbOpenAutomatic);  // only to release the lock
    kvhdndbCreateErrorObject(looked, handleOut);
    return looked;
  }
  if (object.object != 0) {
    // A text opened again is the same reference: database 0 adds no holder.
    *handleOut = object.object;
    tDbObject known;
    return manager.AddObject(*name, known, 0, kDbOpenAutomatic);
  }

  const Status opened = OpenDbObjectByText(*name, objectClass, &object.object, &object.database);
  const Status added = manager.AddObject(*name, object, opened, kDbOpenAutomatic);
  if (opened < 0) {
    if (object.database != 0 && added >= 0) {
      *handleOut = object.object;  // the registered error object
      return opened;
    }
    const Status carried = added < 0 ? added : opened;
    kvhdndbCreateErrorObject(carried, handleOut);
    return carried;
  }
  if (added < 0) {
    // Not kept by the manager (a database opened manually already): the host gets the refusal.
    kvdbCloseDatabase(object.object, 0);
    kvhdndbCreateErrorObject(added, handleOut);
    return added;
  }
  *handleOut = object.object;
  return opened;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbAutoCloseDbObject(uint32_t handle) {
  uint32_t last = 0;
  const Status released = GetDbLifeManager().ReleaseByHandle(handle, &last);
  // The driver's close is due when no holder is left, or when the manager never knew the handle.
  if (last == 1) return kvdbCloseDatabase(handle, 0);
  return released;
}
