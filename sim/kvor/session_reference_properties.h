// Session properties whose values name other objects or carry records: the J1939 ECU (a handle
// of a database ECU), the output stream list (handles of database frames) and the Ethernet
// receive filter (records of 28 bytes). They are kept as set, once they pass the checks here.
#ifndef KVOR_SIM_SESSION_REFERENCE_PROPERTIES_H
#define KVOR_SIM_SESSION_REFERENCE_PROPERTIES_H

#include <cstdint>
#include <optional>

#include "driver_status.h"
#include "property_value.h"
#include "session.h"

namespace nKvorSim {

// What such a property holds before it is set: an Ethernet session has no receive filter.
std::optional<PropertyValue> ReferenceDefaultProperty(const Session &session, uint32_t id);

// 0 if `size` bytes at `value` may be set for `id` on `session`; any other identifier passes.
Status CheckReferenceProperty(const Session &session, uint32_t id, uint32_t size,
                              const void *value);

}  // namespace nKvorSim

#endif
