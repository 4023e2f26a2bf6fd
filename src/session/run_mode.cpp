#include "session/run_mode.h"

#include "kvsvplatform.h"

namespace nKVSVAPI100 {

Status GetRunMode(bool &isBuilt) {
  isBuilt = svIsBoundApp(0) != 0 && (svIsRunTime(0) != 0 || svIsFullFeatureRunTime(0) != 0);
  return 0;
}

}  // namespace nKVSVAPI100
