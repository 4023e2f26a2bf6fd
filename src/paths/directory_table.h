// The classic installation directories by key, with the relocation that a system may install.
#ifndef KVSVAPI_PATHS_DIRECTORY_TABLE_H
#define KVSVAPI_PATHS_DIRECTORY_TABLE_H

#include <string>

#include "paths/ovsysq_status.h"

namespace ovsysq {

// The value of `key` ("sharedstatedir", "datarootdir", ...). The table is built once per process,
// at the first lookup; a failed build is merged into `status` at every lookup, so that all fail
// alike. An absent key gives kOsFault.
std::string LookupDirectory(const char *key, tJsonStatus &status);

}  // namespace ovsysq

#endif
