// kvsvSessionManualCreate: a session from its definition, held by a host reference named after
// its handle, with no project file and no interface record.
#include <mutex>
#include <string>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/kvorutility.h"
#include "session/open_or_create_slot.h"
#include "session/run_mode.h"
#include "session/session_file_path.h"
#include "session/session_manager.h"

using namespace nKVSVAPI100;

namespace {

constexpr char kManualSessionPrefix[] = "___kvorSesn#";

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionManualCreate(const char *database,
                                                          const char *cluster, const char *list,
                                                          const char *interfaceName, uint32_t mode,
                                                          kvsvRefnum *reference) {
  // A host that cannot tell its run mode or the project file's place is not fit to create
  // sessions either.
  bool retry = false;
  Status status = GetRunMode(retry);
  if (status < 0) return status;
  std::string path;
  status = GetSessionFilePath(path);
  if (status < 0) return status;

  cSnLifeManager &manager = gSessionManager;
  if (manager.status.code < 0)
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, 9107,
                               static_cast<uint32_t>(manager.status.code));
  std::lock_guard<cRecursiveMutex> lock(*manager.mutex);

  SvHandle name = svNewHandleClr(8);
  if (name == nullptr) return kvErrOutOfMemory;

  // A refused session is still registered, as handle 0: the program's reference stays valid and
  // its failure surfaces at the first use.
  uint32_t handle = 0;
  status = kvCreateSession(database, cluster, list, interfaceName, mode, &handle);
  if (status < 0) handle = 0;

  if (svStrPrintf(name, "%s%08lx", kManualSessionPrefix, static_cast<unsigned long>(handle)) < 0) {
    DisposeHandle(&name);
    status = kvErrOutOfMemory;
  }
  if (name != nullptr) {
    const Status registered = RegisterReference(kClassSession, name, handle, reference);
    if (registered < 0 && status >= 0) status = registered;
    DisposeHandle(&name);
  }

  if (status >= 0) return OpenOrCreateSlot(manager, nullptr, &handle, false, path, retry);
  if (handle != 0) kvClear(handle);
  return status;
}
