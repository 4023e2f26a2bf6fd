// A host program's view of the library: a session created by definition and held by a host
// reference, guarded single-point reads into a host array (with the host's allocation counters
// alongside), the system and its interfaces by name, and the end of the program.
#include <cinttypes>
#include <cstdio>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace {

void PrintValues(const char *label, kvsvStatus status, SvHandle values) {
  std::printf("%-30s status 0x%08" PRIX32 "  values:", label, static_cast<uint32_t>(status));
  double data[16];
  const int32_t count = svsimReadDoubleArray(values, data, 16);
  for (int32_t i = 0; i < count && i < 16; ++i) std::printf(" %g", data[i]);
  std::printf("\n");
}

// The handle behind a reference, as the host resolves it for the program's nodes.
uint32_t HandleOf(kvsvRefnum reference) {
  for (int32_t i = 0; i < svsimRefCount(); ++i) {
    SvsimRefInfo info{};
    if (svsimGetRef(i, &info) == 1 && info.cookie == reference) {
      std::printf("host reference \"%s\" (%s) -> handle 0x%08" PRIX32 "\n", info.name,
                  info.className, info.handle);
      return info.handle;
    }
  }
  return 0;
}

void PrintStatus(const char *label, kvsvStatus status) {
  char text[160] = {0};
  kvsvStatusToString(status, sizeof text, text);
  std::printf("%-30s status 0x%08" PRIX32 "  %s\n", label, static_cast<uint32_t>(status), text);
}

}  // namespace

int main() {
  kvsvRefnum reference = 0;
  kvsvStatus status = kvsvSessionManualCreate(":memory:", "", "EngineSpeed,VehicleSpeed,CoolantTemp",
                                              "CAN1", kvMode_SignalInSinglePoint, &reference);
  PrintStatus("manual create on CAN1:", status);
  if (status < 0) return 1;
  const uint32_t session = HandleOf(reference);

  // Another node writes on the joined network CAN2; our session on CAN1 sees the values.
  kvsvRefnum writerReference = 0;
  kvsvSessionManualCreate(":memory:", "", "EngineSpeed,VehicleSpeed,CoolantTemp", "CAN2",
                          kvMode_SignalOutSinglePoint, &writerReference);
  const uint32_t writer = HandleOf(writerReference);
  const double first[] = {2450.0, 88.5, 91.25};
  SvHandle out = svsimMakeDoubleArray(first, 3);
  PrintStatus("write on CAN2:", kvsvWriteSignalSinglePoint(writer, out));

  SvHandle values = nullptr;
  status = kvsvReadSignalSinglePoint(session, &values);
  PrintValues("first read (sizes learned):", status, values);

  const double second[] = {2475.5, 89.0, 91.5};
  svDisposeHandle(out);
  out = svsimMakeDoubleArray(second, 3);
  kvsvWriteSignalSinglePoint(writer, out);
  svsimResetCounters();
  const int32_t propertyReads = kvsimCountPropertyReads(kvPropSession_NumInList);
  status = kvsvReadSignalSinglePoint(session, &values);
  PrintValues("second read (steady):", status, values);
  std::printf("steady read: %" PRIu64 " host allocations, %" PRIu64 " resizes, %d property reads\n",
              svsimAllocCount(), svsimResizeCount(),
              kvsimCountPropertyReads(kvPropSession_NumInList) - propertyReads);

  // The system and an interface by name; an unknown name still opens, and fails at first use.
  uint32_t system = 0;
  kvsvSystemOpen(nullptr, &system);
  SvHandle name = svsimMakeString("enet1/monitor");
  uint32_t monitor = 0;
  kvsvInterfaceOpen(&name, &monitor);
  std::printf("system 0x%08" PRIX32 ", \"enet1/monitor\" -> interface 0x%08" PRIX32
              ", system references %" PRIu32 "\n",
              system, monitor, kvsvGetSystemRefCount());
  svDisposeHandle(name);
  name = svsimMakeString("CAN7");
  uint32_t missing = 0;
  PrintStatus("open of \"CAN7\":", kvsvInterfaceOpen(&name, &missing));
  uint32_t protocol = 0;
  PrintStatus("first use of its handle:", kvGetProperty(missing, kvPropIntf_Protocol, 4, &protocol));
  svDisposeHandle(name);

  PrintStatus("read on slot 0:", kvsvReadSignalSinglePoint(0, &values));
  PrintStatus("clear of the session:", kvsvSessionClear(session, reference));
  PrintStatus("read after the clear:", kvsvReadSignalSinglePoint(session, &values));

  // The program stops: the host closes every reference it still holds.
  SvsimEndReport report{};
  svsimEndProgram(&report);
  std::printf("program ended: %d closes called; still open: %d driver session (the error handle of"
              " \"CAN7\") and %d system\n",
              report.closesCalled, kvsimOpenSessionCount(), kvsimOpenSystemCount());
  kvsvSystemManualClose(nullptr, nullptr);
  std::printf("after the system's manual close: %d systems open, %" PRIu32 " references\n",
              kvsimOpenSystemCount(), kvsvGetSystemRefCount());
  svDisposeHandle(values);
  svDisposeHandle(out);
  return 0;
}
