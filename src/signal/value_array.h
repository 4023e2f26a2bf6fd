// Sizing of the host value array that signal reads fill: one 64-bit float per signal behind the
// array's 8-byte header. The count comes from the driver once per slot, not once per call.
#ifndef KVSVAPI_SIGNAL_VALUE_ARRAY_H
#define KVSVAPI_SIGNAL_VALUE_ARRAY_H

#include <cstdint>

#include "core/status.h"
#include "kvsvplatform.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Uses the slot's cached count while the handle is at least the size it needs; otherwise reads
// kvPropSession_NumInList and grows or creates the handle. On failure the array's count is 0; a
// failed property read also forgets the cached count. 0xBFF630B0 if the host cannot grow it.
Status PrepareValueArray(tSessionSlot &slot, uint32_t session, SvHandle *values);

}  // namespace nKVSVAPI100

#endif
