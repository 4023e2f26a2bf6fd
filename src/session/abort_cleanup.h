// The clean-up that every blocking driver call arranges before it blocks: if the host stops the
// program meanwhile, kvsvSessionAbort ends the session, and the blocked call comes back.
#ifndef KVSVAPI_SESSION_ABORT_CLEANUP_H
#define KVSVAPI_SESSION_ABORT_CLEANUP_H

#include <cstdint>

namespace nKVSVAPI100 {

// The host's clean-up mode under which kvsvSessionAbort is registered.
constexpr int32_t kAbortCleanupMode = 6;

// Whether a call with this time limit may block: any limit other than 0.0, NaN included.
bool MayBlock(double timeLimit);

// Registers kvsvSessionAbort for `session` with the host, before a driver call that may block.
// The registration is never taken back, and its outcome is not looked at.
void RegisterAbort(uint32_t session);

// Registers kvsvSessionAbort for `session` with the host if the time limit may block. The
// registration is never taken back, and its outcome is not looked at: the call goes on either way.
void RegisterAbortIfBlocking(uint32_t session, double timeLimit);

}  // namespace nKVSVAPI100

#endif
