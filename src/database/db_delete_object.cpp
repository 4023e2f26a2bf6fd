// The delete of an object that a program created or opened, with every holder it has.
#include "core/internal_error.h"
#include "core/status.h"
#include "database/db_life_manager.h"
#include "kvsvapi.h"
#include "session/kvorutility.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineTooManyHolders = 683;
// Releases tried before the object is deleted with holders left: more is a leak of holders.
constexpr int kMaxReleases = 100;

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvdbDeleteObject(uint32_t handle, kvsvRefnum reference) {
  cDbLifeManager &manager = GetDbLifeManager();
  uint32_t last = 0;
  for (int released = 1;; ++released) {
    if (manager.ReleaseByHandle(handle, &last) < 0 || last == 1) break;
    if (released == kMaxReleases) {
      ReportInternalError(kComponentKvsvapi, nFile::kDatabaseExports, kLineTooManyHolders, 0);
      break;
    }
  }
  const Status unregistered = UnregisterReference(reference);
  const Status deleted = kvdbDeleteObject(handle);
  const Status closed = kvdbCloseDatabase(handle, 0);
  if (deleted < 0) return deleted;
  if (unregistered < 0) return unregistered;
  if (closed < 0) return closed;
  return deleted;
}
