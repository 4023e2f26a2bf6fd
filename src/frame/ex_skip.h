// The skip byte that the Ex forms of the read and convert exports take: when it is set, the call
// returns 0 and touches nothing, not even the session's guard.
#ifndef KVSVAPI_FRAME_EX_SKIP_H
#define KVSVAPI_FRAME_EX_SKIP_H

#include <cstdint>

namespace nKVSVAPI100 {

inline bool SkipRequested(const uint8_t *skip) { return skip != nullptr && *skip != 0; }

}  // namespace nKVSVAPI100

#endif
