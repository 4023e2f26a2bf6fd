// The driver session of one project session entry, with the entry's settings applied.
#ifndef KVSVAPI_SESSION_CREATE_PROJECT_SESSION_H
#define KVSVAPI_SESSION_CREATE_PROJECT_SESSION_H

#include <cstdint>

#include "core/status.h"
#include "session/session_file_entry.h"

namespace nKVSVAPI100 {

// A built application may start before the driver is ready to create sessions: with `retry` a
// refused creation is tried again every 10 ms, 800 attempts in all (about 8 seconds).
constexpr uint32_t kCreateRetryDelayMs = 10;
constexpr uint32_t kCreateAttempts = 800;

// Creates the session of `entry` and applies its settings (ApplySessionEntry). A session whose
// settings are refused is cleared again. `handle` is the session, or 0 on failure. The result is
// the status of the last driver call that counts: the creation's or the settings'.
Status CreateProjectSession(const tSessionEntry &entry, bool retry, uint32_t &handle);

}  // namespace nKVSVAPI100

#endif
