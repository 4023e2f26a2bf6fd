// A host program's view: a signal input session on CAN1 in the driver, its slot in the library,
// and guarded single-point reads into a host array, with the host's allocation counters alongside.
#include <cinttypes>
#include <cstdio>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/session_manager.h"
#include "svsim.h"

namespace {

void PrintValues(const char *label, kvsvStatus status, SvHandle values) {
  std::printf("%-28s status 0x%08" PRIX32 "  values:", label, static_cast<uint32_t>(status));
  if (values != nullptr) {
    const int32_t count = *static_cast<int32_t *>(*values);
    const double *data = reinterpret_cast<const double *>(static_cast<char *>(*values) + 8);
    for (int32_t i = 0; i < count; ++i) std::printf(" %g", data[i]);
  }
  std::printf("\n");
}

}  // namespace

int main() {
  using namespace nKVSVAPI100;
  uint32_t session = 0;
  kvsvStatus status = kvCreateSession(":memory:", "", "EngineSpeed,VehicleSpeed,CoolantTemp", "CAN1",
                                      kvMode_SignalInSinglePoint, &session);
  if (status < 0) {
    std::printf("driver refused the session: 0x%08" PRIX32 "\n", static_cast<uint32_t>(status));
    return 1;
  }
  {
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    CreateSlot(gSessionManager, session, 0);
  }
  std::printf("session 0x%08" PRIX32 " on CAN1, slot %" PRIu32 "\n", session, session & 0xFFFFu);

  const double first[] = {2450.0, 88.5, 91.25};
  kvsimSetSignalValues(session, first, 3);
  SvHandle values = nullptr;
  status = kvsvReadSignalSinglePoint(session, &values);
  PrintValues("first read (sizes learned):", status, values);

  const double second[] = {2475.5, 89.0, 91.5};
  kvsimSetSignalValues(session, second, 3);
  const uint64_t allocations = svsimAllocCount();
  const uint64_t resizes = svsimResizeCount();
  const uint64_t propertyReads = kvsimCountPropertyReads(kvPropSession_NumInList);
  status = kvsvReadSignalSinglePoint(session, &values);
  PrintValues("second read (steady):", status, values);
  std::printf("steady read: %" PRIu64 " host allocations, %" PRIu64 " resizes, %" PRIu64
              " property reads\n",
              svsimAllocCount() - allocations, svsimResizeCount() - resizes,
              kvsimCountPropertyReads(kvPropSession_NumInList) - propertyReads);

  status = kvsvReadSignalSinglePoint(0, &values);
  std::printf("read on slot 0:              status 0x%08" PRIX32 "\n", static_cast<uint32_t>(status));

  char text[128] = {0};
  kvsvStatusToString(kvErrInvalidSession, sizeof text, text);
  std::printf("driver text for 0xBFF63020:  %s\n", text);

  svDisposeHandle(values);
  kvClear(session);
  return 0;
}
