// Making a directory, alone or with its missing parents.
#ifndef KVSVAPI_PATHS_MAKE_DIRECTORY_H
#define KVSVAPI_PATHS_MAKE_DIRECTORY_H

#include <cstdint>
#include <string>

#include "paths/ovsysq_status.h"

namespace ovsysq {

// mkdir(path, 0700). `created` (may be null) gets 0 when the directory was made and 1 when it
// stood there already. A missing parent gives kResourceNotFound ("parent not found"), a
// non-directory in the way kObjectNameCollision, any other failure kOsFault.
void MakeDirectory(const std::string &path, int32_t *created, tJsonStatus &status);

// Makes `path`, first making each missing parent; folds every step's flag into `created` (may
// be null). Stops at the first failure that is not a missing parent.
void MakeDirectoryWithParents(const std::string &path, int32_t *created, tJsonStatus &status);

}  // namespace ovsysq

#endif
