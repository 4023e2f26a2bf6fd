// Reads the text of a CAN database file into a database of one cluster.
#ifndef KVOR_SIM_DBC_READER_H
#define KVOR_SIM_DBC_READER_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "database_model.h"

namespace nKvorSim {

// Where and why a text could not be read. Lines count from 1.
struct tDbcError {
  uint32_t line = 0;
  std::string message;
};

// Reads `text` into *database, which is replaced. Statements that the database has no use for
// are skipped whole. Returns false with *error filled for a text that does not follow the format;
// *database is then unspecified. What files of other tools break in small ways and every reader
// accepts (a byte order mark, a name that starts with a digit, a statement that the next line
// ends instead of its ';') is read, with a warning in *warnings if that is not null.
bool ReadDbc(std::string_view text, tDatabase *database, tDbcError *error,
             std::vector<tDbcError> *warnings = nullptr);

}  // namespace nKvorSim

#endif
