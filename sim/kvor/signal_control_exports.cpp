// The signal controls of kvsim.h. Like every control they are not driver calls, and they report
// misuse with -1.
#include <memory>

#include "driver.h"
#include "kvsim.h"
#include "signal_properties.h"

using namespace nKvorSim;

extern "C" {

int32_t kvsimSetSignalReadFill(uint32_t session, int32_t pairs) {
  const std::shared_ptr<Session> target = Driver::Instance().Sessions().Find(session);
  if (!target || target->ErrorStatus() != 0 || !IsSignalInputMode(target->Definition().mode)) {
    return -1;
  }
  target->SignalsIn().SetFill(pairs < 0 ? -1 : pairs);
  return 0;
}

}  // extern "C"
