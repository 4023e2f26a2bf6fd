#include "session/device_reference_name.h"

#include "kvorproperties.h"

namespace nKVSVAPI100 {

namespace {

constexpr char kDeviceNamePrefix[] = "___kvorDev#";

}  // namespace

Status ReadDeviceReferenceName(uint32_t device, SvHandle name) {
  uint32_t serial = 0;
  const Status read = kvGetProperty(device, kvPropDev_SerNum, sizeof serial, &serial);
  if (read < 0) return read;
  if (svStrPrintf(name, "%s%08lx", kDeviceNamePrefix,
                  static_cast<unsigned long>(static_cast<uint32_t>(~serial))) < 0)
    return kvErrOutOfMemory;
  return read;
}

}  // namespace nKVSVAPI100
