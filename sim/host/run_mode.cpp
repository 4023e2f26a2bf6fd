#include "run_mode.h"

#include <atomic>

#include "kvsvplatform.h"
#include "svsim.h"

namespace svhost {

namespace {

std::atomic<int32_t> gBound{0};
std::atomic<int32_t> gRunTime{0};
std::atomic<int32_t> gFullFeature{0};

}  // namespace

void ResetRunMode() { svsimSetRunMode(0, 0, 0); }

}  // namespace svhost

extern "C" {

int32_t svIsBoundApp(int32_t) { return svhost::gBound.load(); }
int32_t svIsRunTime(int32_t) { return svhost::gRunTime.load(); }
int32_t svIsFullFeatureRunTime(int32_t) { return svhost::gFullFeature.load(); }

void svsimSetRunMode(int32_t bound, int32_t runTime, int32_t fullFeature) {
  svhost::gBound.store(bound);
  svhost::gRunTime.store(runTime);
  svhost::gFullFeature.store(fullFeature);
}

}  // extern "C"
