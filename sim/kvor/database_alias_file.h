// The file in which the driver keeps its database aliases, so that they outlive the process: in
// the driver's configuration directory, which is KVSIM_CONFIG_DIR if that is set, else "kvor"
// in the user's configuration directory (XDG_CONFIG_HOME, else HOME's ".config"). One alias a
// line: the alias, a tab, the baud rate, a tab, the file's path.
#ifndef KVOR_SIM_DATABASE_ALIAS_FILE_H
#define KVOR_SIM_DATABASE_ALIAS_FILE_H

#include <string>

#include "database_aliases.h"

namespace nKvorSim {

// The environment variable that places the driver's configuration directory elsewhere.
constexpr const char *kConfigDirVariable = "KVSIM_CONFIG_DIR";
constexpr const char *kAliasFileName = "kvorAliases.txt";

// The path of the alias file; empty when no configuration directory can be told.
std::string AliasFilePath();

// The aliases of the file; none if there is no file. Lines that are not an alias are skipped.
DatabaseAliases ReadAliasFile();

// Writes `aliases` over the file, whole or not at all, making its directory if need be. False,
// with the reason in *error, if it cannot be written.
bool WriteAliasFile(const DatabaseAliases &aliases, std::string *error);

}  // namespace nKvorSim

#endif
