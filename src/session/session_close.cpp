// kvsvSessionClose, kvsvSessionClear and kvsvSessionAbort: the three ways a session ends.
#include <mutex>

#include "core/internal_error.h"
#include "kvsvapi.h"
#include "session/kvorutility.h"
#include "session/session_manager.h"
#include "session/system_manager.h"
#include "session/teardown_slot.h"

using namespace nKVSVAPI100;

namespace {

Status ReportFailedManager(uint32_t file, uint32_t line) {
  return ReportInternalError(kComponentKvsvapi, file, line,
                             static_cast<uint32_t>(gSessionManager.status.code));
}

// An error handle of a failed system-object open reads as a session; it has no slot to end.
void EndSession(uint32_t handle) {
  if (!RemoveErrorChild(handle)) TeardownSlot(gSessionManager, handle);
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionClose(uint32_t session) {
  if (gSessionManager.status.code < 0) return ReportFailedManager(nFile::kSessionOpenClose, 129);
  std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
  // The host may hand any reference to this close.
  const uint32_t objectClass = ClassFromHandle(static_cast<int32_t>(session));
  if (objectClass == kClassSession)
    EndSession(session);
  else
    CloseDispatch(session, objectClass);
  return 0;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionClear(uint32_t session, kvsvRefnum reference) {
  if (gSessionManager.status.code < 0) return ReportFailedManager(nFile::kSessionIo, 9215);
  std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
  // The reference goes before the session, so that the host never closes it a second time.
  const Status unregistered = UnregisterReference(reference);
  if (session != 0) EndSession(session);
  return unregistered > 0 ? 0 : unregistered;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionAbort(uint64_t session) {
  // Runs on the host's clean-up thread while a call may still be blocked in the driver on this
  // session: no lock, and every status is dropped.
  const auto handle = static_cast<uint32_t>(session);
  EndSession(handle);
  const uint32_t index = SlotIndex(handle);
  if (index > kMaxSlotIndex) return 0;
  tSessionSlot *slot = gSessionManager.slots[index].load();
  if (slot != nullptr && slot->guard.load() != 0) slot->guard.exchange(0);
  return 0;
}
