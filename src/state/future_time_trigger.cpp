// kvsvFutureTimeTrigger: arms the driver's trigger at a time of the host.
#include "core/status.h"
#include "core/timestamps.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvFutureTimeTrigger(uint32_t session, const SvTime *when,
                                                        uint32_t option) {
  if (when == nullptr) return kvErrNullArgument;
  uint32_t protocol = 0;
  const Status status = kvGetProperty(session, kvPropSession_Protocol, sizeof protocol, &protocol);
  if (status < 0) return status;
  // Ethernet sessions count their times in 1 ns since 1970, all others in 100 ns since 1601.
  uint64_t driverTime = 0;
  if (protocol == kvProtocol_Ethernet)
    SvTimeToNsTime(&driverTime, when);
  else
    SvTimeToRawTime(&driverTime, when);
  return kvFutureTimeTrigger(session, driverTime, option);
}
