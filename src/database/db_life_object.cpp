#include "database/db_life_object.h"

#include "kvsvplatform.h"

namespace nKVSVAPI100 {

cDbLifeObject::~cDbLifeObject() {
  if (object.isErrorObject != 0) kvdbCloseDatabase(object.object, 1);
}

}  // namespace nKVSVAPI100
