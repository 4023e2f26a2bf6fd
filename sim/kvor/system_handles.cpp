#include "system_handles.h"

#include "inventory.h"

namespace nKvorSim {

uint32_t HandleOf(const SystemObject &object) {
  return 0x01000000u | (object.system << 16) | (object.device << 8) | object.port;
}

std::optional<SystemObject> DecodeSystemHandle(uint32_t handle) {
  if (!IsSystemClassHandle(handle)) return std::nullopt;
  const uint32_t system = (handle >> 16) & 0xFFu;
  const uint32_t device = (handle >> 8) & 0xFFu;
  const uint32_t reserved = (handle >> 4) & 0xFu;
  const uint32_t port = handle & 0xFu;
  if (system == 0 || reserved != 0) return std::nullopt;
  if (device == 0) {
    if (port != 0) return std::nullopt;
    return SystemObject{SystemObjectKind::kSystem, system, 0, 0};
  }
  const std::vector<DeviceRecord> &devices = Devices();
  if (device > devices.size()) return std::nullopt;
  if (port == 0) return SystemObject{SystemObjectKind::kDevice, system, device, 0};
  if (port > devices[device - 1].interfaces.size()) return std::nullopt;
  return SystemObject{SystemObjectKind::kInterface, system, device, port};
}

}  // namespace nKvorSim
