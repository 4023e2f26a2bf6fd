// What the library knows of one driver handle of a database or of an object inside one.
#ifndef KVSVAPI_DATABASE_DB_OBJECT_H
#define KVSVAPI_DATABASE_DB_OBJECT_H

#include <cstdint>

namespace nKVSVAPI100 {

struct tDbObject {
  uint32_t object = 0;         // the driver's handle; a database's own equals `database`
  uint32_t database = 0;       // the database that holds it
  uint32_t objectClass = 0;    // class code: 0 database, 0x10000 cluster, 0x20000 frame, ...
  uint32_t isErrorObject = 0;  // 1: made by the driver to stand for a failed open
};

}  // namespace nKVSVAPI100

#endif
