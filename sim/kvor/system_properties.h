// The properties of the system, its devices and its interfaces. They describe hardware, so none
// can be set.
#ifndef KVOR_SIM_SYSTEM_PROPERTIES_H
#define KVOR_SIM_SYSTEM_PROPERTIES_H

#include <cstdint>
#include <optional>

#include "driver_status.h"
#include "property_value.h"
#include "system_handles.h"

namespace nKvorSim {

// The value of property `id` of `object`, if the object has that property.
std::optional<PropertyValue> SystemObjectProperty(const SystemObject &object, uint32_t id);

// kvSetProperty on a system object: refused, as read-only when the property exists.
Status SetSystemObjectProperty(const SystemObject &object, uint32_t id);

}  // namespace nKvorSim

#endif
