// The parser of the texts by which the host names database objects: "name", separators, then
// "database.cluster" (or the database alone for its default cluster).
#ifndef KVSVAPI_DATABASE_FIND_BY_REFERENCE_STRING_H
#define KVSVAPI_DATABASE_FIND_BY_REFERENCE_STRING_H

#include <cstdint>

#include "core/status.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// Opens the database that the counted text `text` names and finds its object of `objectClass`
// in the named cluster. `*databaseOut` gets the database opened, also when the find fails (it is
// then closed again); `*objectOut` the object. 0xBFF63163: no text; 0xBFF63164: no database
// part; 0xBFF63173: too many dots in the object's name; else the driver's status.
Status FindDbObjectByReferenceString(SvHandle text, uint32_t objectClass, uint32_t *databaseOut,
                                     uint32_t *objectOut);

// Opens what the counted text `text` names: a database by its name or alias for class 0,
// otherwise the object of a reference text. `*handleOut` gets the object (0 on failure) and
// `*databaseOut` its database.
Status OpenDbObjectByText(SvHandle text, uint32_t objectClass, uint32_t *handleOut,
                          uint32_t *databaseOut);

}  // namespace nKVSVAPI100

#endif
