// A sub-property's list entry, named by the host as a decimal index or as a name of the session's
// list.
#ifndef KVSVAPI_PROPERTY_SESSION_NAME_TO_INDEX_H
#define KVSVAPI_PROPERTY_SESSION_NAME_TO_INDEX_H

#include <cstdint>

#include "core/status.h"
#include "kvsvapi.h"

namespace nKVSVAPI100 {

// The decimal number of `text`: 0 for an empty text, -1 if any byte is not a digit. Digits wrap
// in 32 bits and the result is read as signed, so that 2^31 and above come out negative.
int32_t ParseDecimalString(const SvStr &text);

// The zero-based entry of `session`'s list that `subId` names. A null or empty `subId` is entry 0;
// a text that starts with a digit is the index itself (0xBFF6317F if it is not a number, index
// -1); any other text is looked up among the list's names, which are read from the driver once
// per slot and kept on it (0xBFF63180 and index -1 for no match). The lookup holds the slot's
// list guard: 0xBFF63020 for no slot, 0xBFF63027 for a busy or closing one. The driver's status
// if the list cannot be read; 0xBFF63010 for no memory.
Status SessionNameToIndex(uint32_t session, const SvHandle *subId, int32_t *indexOut);

}  // namespace nKVSVAPI100

#endif
