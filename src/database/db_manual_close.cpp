// A program's own close of a database object, of a whole database, or of a database's objects
// but the database itself.
#include <new>
#include <string>

#include "core/internal_error.h"
#include "core/status.h"
#include "database/db_life_manager.h"
#include "kvsvapi.h"
#include "session/kvorutility.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineCloseAllOverrun = 315;
constexpr uint32_t kLineChildrenOverrun = 425;

Status FirstError(Status running, Status next) { return running < 0 ? running : next; }

// Removes the host's references of the texts of the walk that BeginWalk opened with `count`
// texts, all but those of `skip`. The first failed removal, else 0. More texts than counted
// means that the account changed under a held lock: reported with `overrunLine`.
Status UnregisterWalkedTexts(cDbLifeManager &manager, uint32_t count, uint32_t skip,
                             uint32_t overrunLine) {
  Status result = 0;
  tDbObject object;
  std::string name;
  try {
    for (uint32_t seen = 0;; ++seen) {
      if (manager.NextInWalk(&object, &name) < 0 || object.object == 0) break;
      if (seen == count)
        ReportInternalError(kComponentKvsvapi, nFile::kDatabaseExports, overrunLine, 0);
      if (object.object == skip) continue;
      result = FirstError(result, UnregisterReferenceByName(object.objectClass, &name));
    }
  } catch (const std::bad_alloc &) {
    result = FirstError(result, kvErrOutOfMemory);
  }
  return result;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvdbManualClose(uint32_t handle, SvHandle name,
                                                    kvsvRefnum reference, int32_t closeAll,
                                                    uint64_t *reserved1, uint64_t *reserved2) {
  if (reserved1 != nullptr) *reserved1 = 0;
  if (reserved2 != nullptr) *reserved2 = 0;
  cDbLifeManager &manager = GetDbLifeManager();
  Status released = 0, unregistered = 0, closed = 0;
  if (closeAll == 0) {
    uint32_t last = 0;
    released = manager.ReleaseByName(name, handle, &last);
    // Other holders of the text remain: neither the driver nor the host hears of this close.
    if (last == 0) return released < 0 ? released : 0;
    unregistered = UnregisterReference(reference);
    closed = kvdbCloseDatabase(handle, 0);
  } else {
    uint32_t count = 0;
    const Status walk = manager.BeginWalk(handle, &count);
    if (walk < 0 || count == 0) {
      unregistered = UnregisterReference(reference);
    } else {
      unregistered = UnregisterWalkedTexts(manager, count, 0, kLineCloseAllOverrun);
      manager.EndWalk();
    }
    released = manager.RemoveDatabase(handle);
    closed = kvdbCloseDatabase(handle, 1);
  }
  if (closed < 0) return closed;
  if (unregistered < 0) return unregistered;
  if (released < 0) return released;
  return closed;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvhdndbManualCloseChildren(uint32_t handle) {
  cDbLifeManager &manager = GetDbLifeManager();
  uint32_t count = 0;
  const Status walk = manager.BeginWalk(handle, &count);
  if (walk < 0) {
    manager.RemoveChildren(handle);
    return walk;
  }
  Status result = 0;
  // A walk over a database the manager no longer holds has ended already.
  if (count != 0) {
    result = UnregisterWalkedTexts(manager, count, handle, kLineChildrenOverrun);
    result = FirstError(result, manager.EndWalk());
  }
  const Status removed = manager.RemoveChildren(handle);
  return result < 0 ? result : (removed < 0 ? removed : 0);
}
