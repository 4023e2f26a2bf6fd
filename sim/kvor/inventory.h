// The hardware of the virtual system: its devices, their interfaces, and the networks that join
// interfaces together.
#ifndef KVOR_SIM_INVENTORY_H
#define KVOR_SIM_INVENTORY_H

#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

namespace nKvorSim {

enum Protocol : uint32_t {
  kProtocolCan = 0,
  kProtocolFlexRay = 1,
  kProtocolLin = 2,
  kProtocolEthernet = 3
};

struct InterfaceRecord {
  const char *name;
  uint32_t protocol;
  uint32_t number;   // the digit of the name: 2 for CAN2
  uint32_t network;  // interfaces with the same network hear each other
};

struct DeviceRecord {
  const char *name;
  uint32_t serialNumber;
  uint32_t productNumber;
  std::vector<InterfaceRecord> interfaces;  // port n is interfaces[n - 1]
};

// Number of distinct networks among the interfaces.
constexpr uint32_t kNetworkCount = 5;

// Number of interfaces of all devices together.
constexpr uint32_t kInterfaceCount = 9;

// The devices, device n at index n - 1.
const std::vector<DeviceRecord> &Devices();

struct InterfacePlace {
  uint32_t device;  // 1-based
  uint32_t port;    // 1-based
  uint32_t index;   // 0-based among all interfaces, device by device: a key for per-interface state
  const InterfaceRecord *record;
};

// The interface of that name, compared without regard to case.
std::optional<InterfacePlace> FindInterface(std::string_view name);

// InterfacePlace::index of port `port` of device `device`, both 1-based and in the inventory.
uint32_t InterfaceIndexAt(uint32_t device, uint32_t port);

}  // namespace nKvorSim

#endif
