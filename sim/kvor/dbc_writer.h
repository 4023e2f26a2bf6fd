// Writes a database as the text of a CAN database file, which the reader reads back to the same
// objects.
#ifndef KVOR_SIM_DBC_WRITER_H
#define KVOR_SIM_DBC_WRITER_H

#include <string>

#include "database_model.h"

namespace nKvorSim {

// The text of `database` in *text. Returns false, with the reason in *error, for a database
// that the file format cannot hold: not exactly one cluster, a LIN schedule, a name that is not
// an identifier, a signal outside its frame. Attributes are written with the definitions and
// values of the database (see dbc_attribute_values.h).
bool WriteDbc(const tDatabase &database, std::string *text, std::string *error);

}  // namespace nKvorSim

#endif
