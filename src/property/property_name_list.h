// A session's list of names kept on its slot: the driver's comma-separated text of one property,
// read at the first lookup that needs it.
#ifndef KVSVAPI_PROPERTY_PROPERTY_NAME_LIST_H
#define KVSVAPI_PROPERTY_PROPERTY_NAME_LIST_H

#include <cstdint>

#include "core/status.h"

namespace nKVSVAPI100 {

class cNameList;

// Makes `*list` from the text of property `id` of `session` if it is null; a list already there
// stays, so that later lookups read nothing. A failed size or text read returns the driver's
// status and keeps no list; 0xBFF63010 if the text finds no memory. The caller holds the slot's
// list guard. The list itself may throw std::bad_alloc.
Status EnsurePropertyNameList(uint32_t session, uint32_t id, cNameList *&list);

}  // namespace nKVSVAPI100

#endif
