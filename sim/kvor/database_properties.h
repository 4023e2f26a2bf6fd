// The properties of database objects, read from and written into the database itself.
#ifndef KVOR_SIM_DATABASE_PROPERTIES_H
#define KVOR_SIM_DATABASE_PROPERTIES_H

#include <cstdint>

#include "database_object.h"
#include "driver_status.h"
#include "property_value.h"

namespace nKvorSim {

// The value of property `id` of the object; kvsimErrPropertyUnknown for a property that the
// object's class does not have, or that this object has no value for.
Status GetDatabaseProperty(const tObjectRef &object, uint32_t id, iObjectHandles &handles,
                           PropertyValue *value);

// Sets property `id` of the object from the caller's `size` bytes; handles in the value are found
// through `handles`. What follows from other properties is read-only; names must stay
// identifiers, unique among their siblings, and frame identifiers unique in their cluster.
Status SetDatabaseProperty(const tObjectRef &object, uint32_t id, uint32_t size, const void *value,
                           iObjectHandles &handles);

}  // namespace nKvorSim

#endif
