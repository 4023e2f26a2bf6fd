// Session and interface control that needs nothing of the library: each export hands its
// arguments to the driver as they are and returns the driver's status. They take no slot, lock
// or guard, so they run beside any read or write on the same session.
#include "kvsvapi.h"
#include "kvsvplatform.h"

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionStart(uint32_t session, uint32_t scope) {
  return kvStart(session, scope);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionStop(uint32_t session, uint32_t scope) {
  return kvStop(session, scope);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionFlush(uint32_t session) { return kvFlush(session); }

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionConnectTerminals(uint32_t session, const char *source,
                                                              const char *destination) {
  return kvConnectTerminals(session, source, destination);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionDisconnectTerminals(uint32_t session,
                                                                 const char *source,
                                                                 const char *destination) {
  return kvDisconnectTerminals(session, source, destination);
}

extern "C" KVSV_EXPORT kvsvStatus
kvsvSessionCreateSvTiming_FlexRayMacrotick(uint32_t session, uint64_t *timingSource) {
  return kvhdnCreateSvTiming_FlexRayMacrotick(session, timingSource);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvInterfaceBlink(uint32_t interfaceRef, uint32_t mode) {
  return kvBlink(interfaceRef, mode);
}
