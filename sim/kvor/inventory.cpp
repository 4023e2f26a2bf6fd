#include "inventory.h"

#include <cctype>

namespace nKvorSim {

namespace {

bool SameNameIgnoringCase(std::string_view a, std::string_view b) {
  if (a.size() != b.size()) return false;
  for (size_t i = 0; i < a.size(); ++i) {
    if (std::tolower(static_cast<unsigned char>(a[i])) !=
        std::tolower(static_cast<unsigned char>(b[i]))) {
      return false;
    }
  }
  return true;
}

}  // namespace

const std::vector<DeviceRecord> &Devices() {
  static const std::vector<DeviceRecord> devices = {
      {"BusBox 6 CAN/LIN",
       1001234,
       0x7A06,
       {{"CAN1", kProtocolCan, 1, 0},
        {"CAN2", kProtocolCan, 2, 0},
        {"CAN3", kProtocolCan, 3, 1},
        {"CAN4", kProtocolCan, 4, 1},
        {"LIN1", kProtocolLin, 1, 2},
        {"LIN2", kProtocolLin, 2, 2}}},
      {"BusBox 3 FlexRay/Ethernet",
       1001235,
       0x7A03,
       {{"FlexRay1", kProtocolFlexRay, 1, 3},
        {"FlexRay2", kProtocolFlexRay, 2, 3},
        {"ENET1", kProtocolEthernet, 1, 4}}},
  };
  return devices;
}

std::optional<InterfacePlace> FindInterface(std::string_view name) {
  const std::vector<DeviceRecord> &devices = Devices();
  uint32_t index = 0;
  for (uint32_t d = 0; d < devices.size(); ++d) {
    const std::vector<InterfaceRecord> &interfaces = devices[d].interfaces;
    for (uint32_t p = 0; p < interfaces.size(); ++p, ++index) {
      if (SameNameIgnoringCase(name, interfaces[p].name)) {
        return InterfacePlace{d + 1, p + 1, index, &interfaces[p]};
      }
    }
  }
  return std::nullopt;
}

uint32_t InterfaceIndexAt(uint32_t device, uint32_t port) {
  const std::vector<DeviceRecord> &devices = Devices();
  uint32_t index = port - 1;
  for (uint32_t d = 0; d + 1 < device; ++d) {
    index += static_cast<uint32_t>(devices[d].interfaces.size());
  }
  return index;
}

}  // namespace nKvorSim
