// The slot's buffer of driver records: a malloc block that is only ever replaced by a larger one.
#ifndef KVSVAPI_FRAME_FRAME_BUFFER_H
#define KVSVAPI_FRAME_FRAME_BUFFER_H

#include <cstdint>

#include "core/status.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Makes `frameBuffer` hold at least `size` bytes. A buffer already that large stays as it is. A
// failed allocation leaves no buffer (size 0) and gives 0xBFF630B0.
Status GrowFrameBuffer(tSessionSlot &slot, uint64_t size);

}  // namespace nKVSVAPI100

#endif
