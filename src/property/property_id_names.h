// The literal names of property identifiers, for the words of error information.
#ifndef KVSVAPI_PROPERTY_PROPERTY_ID_NAMES_H
#define KVSVAPI_PROPERTY_PROPERTY_ID_NAMES_H

#include <cstdint>

namespace nKVSVAPI100 {

// The constant name of `id`, or null when its class has no names or the identifier has none.
// Allocates nothing and keeps no state.
const char *PropertyIdToName(uint32_t id);

// The type field of an identifier: the shape of the value at the driver.
constexpr uint32_t PropertyType(uint32_t id) { return id >> 24; }
// Type of NUL-terminated text properties, which name objects rather than refer to them.
constexpr uint32_t kPropertyTypeText = 0x03;

}  // namespace nKVSVAPI100

#endif
