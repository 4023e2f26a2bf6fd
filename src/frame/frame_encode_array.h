// A host array of frame clusters encoded into the slot's frameBuffer, one record behind the other.
#ifndef KVSVAPI_FRAME_FRAME_ENCODE_ARRAY_H
#define KVSVAPI_FRAME_FRAME_ENCODE_ARRAY_H

#include <cstdint>

#include "core/status.h"
#include "frame/frame_encode.h"
#include "kvsvplatform.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Encodes the first `count` clusters of `stride` bytes of the array `frames` in order, from the
// start of frameBuffer, and sets `*size` to the bytes the records take. A payload over
// `payloadMax` gives 0xBFF6309F and the walk goes on, so that every record keeps its place. A
// record that would pass the end of frameBuffer extends it first; if that fails the result is
// 0xBFF63010, with the buffer forgotten and `*size` 0.
Status EncodeFrameArray(tSessionSlot &slot, SvHandle frames, int32_t count, uint32_t stride,
                        int32_t payloadMax, eRecordEncoding encoding, uint32_t *size);

}  // namespace nKVSVAPI100

#endif
