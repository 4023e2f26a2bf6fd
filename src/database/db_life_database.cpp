#include "database/db_life_database.h"

namespace nKVSVAPI100 {

bool cDbLifeDatabase::ReleaseOne(uint32_t handle) {
  bool released = false;
  bool holdersRemain = false;
  for (auto &entry : texts) {
    cDbLifeObject &text = *entry.second;
    if (text.object.object != handle || text.refCount == 0) continue;
    if (!released) {
      released = true;
      --text.refCount;
      if (text.refCount != 0) holdersRemain = true;
    } else {
      holdersRemain = true;
    }
  }
  return holdersRemain;
}

}  // namespace nKVSVAPI100
