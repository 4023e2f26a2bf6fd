#include "session/create_project_session.h"

#include "core/sleep.h"
#include "kvsvplatform.h"
#include "session/apply_session_entry.h"

namespace nKVSVAPI100 {

namespace {

Status CreateSession(const tSessionEntry &entry, bool retry, uint32_t &handle) {
  for (uint32_t attempt = 1;; ++attempt) {
    const Status status =
        kvCreateSession(entry.Database(), entry.Cluster(), entry.List(), entry.Interface(),
                        static_cast<uint32_t>(entry.mode), &handle);
    if (status >= 0) return status;
    handle = 0;
    if (!retry || attempt == kCreateAttempts) return status;
    SleepMs(kCreateRetryDelayMs);
  }
}

}  // namespace

Status CreateProjectSession(const tSessionEntry &entry, bool retry, uint32_t &handle) {
  handle = 0;
  const Status created = CreateSession(entry, retry, handle);
  if (created < 0) return created;
  const Status applied = ApplySessionEntry(handle, entry, created);
  if (applied < 0) {
    kvClear(handle);
    handle = 0;
  }
  return applied;
}

}  // namespace nKVSVAPI100
