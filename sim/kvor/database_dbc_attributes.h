// The attribute calls on an object of a database read from a file: an attribute's value, the
// texts of an enumeration attribute, or the names of the attributes of the object's kind.
#ifndef KVOR_SIM_DATABASE_DBC_ATTRIBUTES_H
#define KVOR_SIM_DATABASE_DBC_ATTRIBUTES_H

#include <cstdint>
#include <string>

#include "database_object.h"
#include "driver_status.h"

namespace nKvorSim {

// What the attribute calls give for `mode` (0 value, 1 enumeration texts, 2 names), as text.
// A database or cluster answers for the file's own attributes. *isDefault is set in mode 0 only.
// kvsimErrInvalidClass for another kind of object, kvsimErrPropertyUnknown for an attribute that
// the object's kind does not define, kvsimErrInvalidArgument for another mode or, in mode 1, an
// attribute that is no enumeration.
Status DbcAttributeText(const tObjectRef &object, uint32_t mode, const char *name,
                        std::string *text, bool *isDefault);

}  // namespace nKvorSim

#endif
