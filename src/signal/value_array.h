// Sizing of the host arrays that signal reads fill: value arrays of 64-bit floats and timestamp
// arrays of SvTime, each behind an 8-byte header. The count comes from the driver once per slot,
// not once per call.
#ifndef KVSVAPI_SIGNAL_VALUE_ARRAY_H
#define KVSVAPI_SIGNAL_VALUE_ARRAY_H

#include <cstdint>

#include "core/status.h"
#include "kvsvplatform.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Bytes of a value array of `n` 64-bit floats, and of a timestamp array of `n` SvTime; sizes of
// signal arrays are counted in 32 bits.
constexpr uint32_t ValueArrayBytes(uint32_t n) { return n * 8u + 8u; }
constexpr uint32_t TimestampArrayBytes(uint32_t n) { return n * 16u + 8u; }

// Uses the slot's cached count while the handle is at least the size it needs; otherwise reads
// kvPropSession_NumInList and grows or creates the handle. On failure the array's count is 0; a
// failed property read also forgets the cached count. 0xBFF630B0 if the host cannot grow it.
Status PrepareValueArray(tSessionSlot &slot, uint32_t session, SvHandle *values);

// Makes `*array` hold at least `bytes`: a null handle is made at that size, a smaller one is
// disposed of and made afresh (its content is not kept, so nothing is copied), a larger one stays.
// 0xBFF630B0 if the host refuses, with the handle null.
Status FitSignalArray(SvHandle *array, uint32_t bytes);

}  // namespace nKVSVAPI100

#endif
