// A negative frame count asks for every frame that the session can hold: the whole list of a
// single-point session, or what its queue holds. Learnt once and kept in the slot.
#ifndef KVSVAPI_FRAME_ALL_FRAMES_COUNT_H
#define KVSVAPI_FRAME_ALL_FRAMES_COUNT_H

#include <cstdint>

#include "core/status.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Turns a negative `n` into the session's frame limit and returns the call's status, given the
// status so far. Only a time limit of 0.0 allows it (else 0xBFF630A0, `n` left negative). A queue's
// size in bytes becomes frames of `recordBytes` each. A failed property read gives its status, and
// `n` is then whatever limit the slot had.
Status ResolveAllFrames(tSessionSlot &slot, uint32_t session, double timeout,
                        uint32_t recordBytes, Status status, int32_t &n);

}  // namespace nKVSVAPI100

#endif
