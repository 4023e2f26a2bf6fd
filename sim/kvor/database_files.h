// Database files on disk: where a name points, and reading and writing them with a message that
// says what went wrong.
#ifndef KVOR_SIM_DATABASE_FILES_H
#define KVOR_SIM_DATABASE_FILES_H

#include <string>
#include <string_view>

#include "database_model.h"
#include "driver_status.h"

namespace nKvorSim {

// The environment variable that names the directory of relative database paths; without it they
// are relative to the working directory.
constexpr const char *kDatabaseDirVariable = "KVSIM_DATABASE_DIR";

// The path that a database name stands for: an absolute path as it is, any other relative to the
// database directory.
std::string DatabasePath(std::string_view name);

// The one path by which an existing file is known, whatever way it was named; empty if no
// regular file is there.
std::string CanonicalPath(const std::string &path);

// Reads the database file at `path`. Fails with kvsimErrDatabaseNotFound or kvsimErrDatabaseSyntax
// and a message in *error that names `shownName` and, for a syntax error, the line. A file read
// leaves in *error the warnings about what it accepted from other tools, each with its line.
Status LoadDatabaseFile(const std::string &path, std::string_view shownName, tDatabase *database,
                        std::string *error);

// Writes `database` to `path`, replacing the file whole or not at all. Fails with
// kvsimErrDatabaseWrite and a message.
Status SaveDatabaseFile(const tDatabase &database, const std::string &path, std::string *error);

}  // namespace nKvorSim

#endif
