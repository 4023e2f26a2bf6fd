// What a CAN conversion session's records look like, learnt from the session: fixed records for a
// payload limit of 8 or less, variable records up to 64 bytes, or J1939 records of long messages.
#ifndef KVSVAPI_CONVERT_CAN_CONVERSION_KIND_H
#define KVSVAPI_CONVERT_CAN_CONVERSION_KIND_H

#include <cstdint>

#include "core/status.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Sets frameKind and the payload limit (cachedSamples) from the session's application protocol
// and kvPropSession_PayldLenMax. A failed read of the limit leaves it not known and gives the
// driver's status; a limit above 64 (above 1785 for J1939) leaves it not known and gives
// 0xBFF630AF.
Status LearnCanConversionKind(tSessionSlot &slot, uint32_t session);

}  // namespace nKVSVAPI100

#endif
