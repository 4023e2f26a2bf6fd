// The sessions of the project session file that share an interface, a database and a cluster:
// the siblings that the first open on an interface creates together.
#ifndef KVSVAPI_SESSION_SESSION_FILE_SIBLINGS_H
#define KVSVAPI_SESSION_SESSION_FILE_SIBLINGS_H

#include "core/status.h"
#include "session/malloc_block.h"

namespace nKVSVAPI100 {

// Lists, in file order, every session whose interface without its "/suffix" equals
// `interfaceKey` and whose cluster and database equal `cluster` and `database`, all compared
// exactly. `names` gets the names, each NUL-terminated, and one more NUL at the end, so that an
// empty list is a lone NUL. Names are looked at up to 255 characters; an empty one is left out.
// 0xBFF63092: no file. 0xBFF63001 with a report (file 11): an entry that cannot be taken apart,
// which also drops the names found so far. 0xBFF63010: out of memory. On failure `names` is
// empty.
Status ListSiblingSessions(const char *interfaceKey, const char *database, const char *cluster,
                           const char *path, tMallocBlock &names);

}  // namespace nKVSVAPI100

#endif
