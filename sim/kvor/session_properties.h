// The properties of a session. The definition gives read-only properties (mode, list, number of
// items, interface, protocol, database, cluster); any other identifier is stored as the bytes a
// caller sets and read back as set, plainly or per item of the list. Frame sessions add the
// defaults and live values of frame_properties.h, signal sessions the defaults of
// signal_properties.h, conversion sessions those of conversion_properties.h.
#ifndef KVOR_SIM_SESSION_PROPERTIES_H
#define KVOR_SIM_SESSION_PROPERTIES_H

#include <cstdint>

#include "driver_status.h"
#include "session.h"

namespace nKvorSim {

Status GetSessionPropertySize(const Session &session, uint32_t id, uint32_t *size);
Status GetSessionProperty(const Session &session, uint32_t id, uint32_t size, void *value);
Status SetSessionProperty(Session &session, uint32_t id, uint32_t size, const void *value);

// `index` names an item of the session's list.
Status GetSessionSubProperty(const Session &session, uint32_t index, uint32_t id, uint32_t size,
                             void *value);
Status SetSessionSubProperty(Session &session, uint32_t index, uint32_t id, uint32_t size,
                             const void *value);

}  // namespace nKvorSim

#endif
