// kvsvSessionOpen: the host's open of a session reference, by the name of a project session.
#include <mutex>
#include <string>

#include "core/internal_error.h"
#include "kvsvapi.h"
#include "session/open_or_create_slot.h"
#include "session/run_mode.h"
#include "session/session_file_path.h"
#include "session/session_manager.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionOpen(SvHandle *name, uint32_t *session,
                                                  uint64_t /*context*/) {
  // Without a run mode the open does not retry; without a path it finds no entry, and the error
  // session says so.
  bool retry = false;
  GetRunMode(retry);
  std::string path;
  GetSessionFilePath(path);

  cSnLifeManager &manager = gSessionManager;
  if (manager.status.code < 0)
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionOpenClose, 74,
                               static_cast<uint32_t>(manager.status.code));
  std::lock_guard<cRecursiveMutex> lock(*manager.mutex);
  // Whatever went wrong travels in the error session, so that the host's open itself succeeds.
  OpenOrCreateSlot(manager, name, session, true, path, retry);
  return 0;
}
