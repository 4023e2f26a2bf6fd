// The slot's frameBuffer as the write exports keep it: replaced whole, with no copy, when more
// frames or a longer message need more room; extended in place only when a record would pass its
// end. A failure leaves no buffer and the session's sizes forgotten, so that the next call asks
// the driver again.
#ifndef KVSVAPI_FRAME_FRAME_WRITE_BUFFER_H
#define KVSVAPI_FRAME_FRAME_WRITE_BUFFER_H

#include <cstdint>

#include "core/status.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Frees frameBuffer and puts the frame count and the payload limit back to not known.
void ForgetFrameBuffer(tSessionSlot &slot);

// Frees frameBuffer and makes a new block of `size` bytes, its contents undefined. A size of 0
// leaves no block, which is no failure. 0, or 0xBFF63010 after ForgetFrameBuffer.
Status ReplaceFrameBuffer(tSessionSlot &slot, uint64_t size);

// Makes frameBuffer hold at least `size` bytes and keeps what it holds. 0, or 0xBFF63010 after
// ForgetFrameBuffer.
Status ExtendFrameBuffer(tSessionSlot &slot, uint64_t size);

}  // namespace nKVSVAPI100

#endif
