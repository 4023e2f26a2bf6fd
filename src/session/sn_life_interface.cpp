#include "session/sn_life_interface.h"

namespace nKVSVAPI100 {

cSnLifeInterface::cSnLifeInterface() : sessions(16) { sessions.max_load_factor(1.0f); }

cSnLifeInterface::~cSnLifeInterface() {
  for (auto &entry : sessions) delete entry.second;
}

}  // namespace nKVSVAPI100
