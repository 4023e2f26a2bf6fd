// One session name of a project interface record.
#ifndef KVSVAPI_SESSION_SN_LIFE_SESSION_H
#define KVSVAPI_SESSION_SN_LIFE_SESSION_H

#include <cstdint>

namespace nKVSVAPI100 {

class cSnLifeSession {
 public:
  enum eState : uint32_t { kCreated = 1, kClaimed = 2, kGone = 3 };

  uint32_t state = kCreated;
  uint32_t handle = 0;  // driver session, 0 if none
  int32_t status = 0;   // outcome of creating it; a later open of this name gets it
};

}  // namespace nKVSVAPI100

#endif
