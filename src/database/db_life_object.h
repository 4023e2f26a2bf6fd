// One registered text of a database object and the number of its holders.
#ifndef KVSVAPI_DATABASE_DB_LIFE_OBJECT_H
#define KVSVAPI_DATABASE_DB_LIFE_OBJECT_H

#include <boost/noncopyable.hpp>
#include <cstdint>

#include "database/db_object.h"

namespace nKVSVAPI100 {

class cDbLifeObject : boost::noncopyable {
 public:
  explicit cDbLifeObject(const tDbObject &object) : object(object) {}
  // An error object belongs to the library alone, so its end closes it at the driver; any other
  // object belongs to the driver and is left open.
  ~cDbLifeObject();

  tDbObject object;
  uint32_t refCount = 1;
};

}  // namespace nKVSVAPI100

#endif
