// Property values as the driver passes them: plain bytes whose shape follows the type field of
// the identifier (bits 31-24).
#ifndef KVOR_SIM_PROPERTY_VALUE_H
#define KVOR_SIM_PROPERTY_VALUE_H

#include <cstdint>
#include <string_view>
#include <vector>

#include "driver_status.h"

namespace nKvorSim {

using PropertyValue = std::vector<uint8_t>;

PropertyValue U32Value(uint32_t value);
// Text with its terminating NUL, which counts in the value's size.
PropertyValue TextValue(std::string_view text);
// An array of 4-byte object handles.
PropertyValue HandleArrayValue(const std::vector<uint32_t> &handles);

// Byte size of the values of `id`'s type when it is fixed (4, 8 or 1); 0 for the types whose
// size the value decides.
uint32_t FixedValueSize(uint32_t id);

// Copies `value` into the caller's buffer of `size` bytes; a smaller buffer is refused whole.
Status CopyValueOut(const PropertyValue &value, uint32_t size, void *out);

// The stored form of a value that a caller sets for `id`: fixed-size types must come with their
// exact size, and text is given its NUL if the caller left it out.
Status ValueFromCaller(uint32_t id, uint32_t size, const void *in, PropertyValue *value);

}  // namespace nKvorSim

#endif
