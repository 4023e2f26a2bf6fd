// The literal names of property identifiers, for the words of error information.
#ifndef KVSVAPI_PROPERTY_PROPERTY_ID_NAMES_H
#define KVSVAPI_PROPERTY_PROPERTY_ID_NAMES_H

#include <cstdint>

namespace nKVSVAPI100 {

// The constant name of `id`, or null when its class has no names or the identifier has none.
// Allocates nothing and keeps no state.
const char *PropertyIdToName(uint32_t id);

}  // namespace nKVSVAPI100

#endif
