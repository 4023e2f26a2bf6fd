#include "system_properties.h"

#include <vector>

#include "inventory.h"
#include "kvorproperties.h"
#include "kvsim.h"

namespace nKvorSim {

namespace {

// Handles of the interfaces of one device, or of all devices (device 0), of one protocol or of
// any (protocol absent), as listed by system `system`.
PropertyValue InterfaceRefs(uint32_t system, uint32_t device, std::optional<uint32_t> protocol) {
  std::vector<uint32_t> handles;
  const std::vector<DeviceRecord> &devices = Devices();
  for (uint32_t d = 1; d <= devices.size(); ++d) {
    if (device != 0 && d != device) continue;
    const std::vector<InterfaceRecord> &interfaces = devices[d - 1].interfaces;
    for (uint32_t p = 1; p <= interfaces.size(); ++p) {
      if (protocol && interfaces[p - 1].protocol != *protocol) continue;
      handles.push_back(HandleOf(SystemObject{SystemObjectKind::kInterface, system, d, p}));
    }
  }
  return HandleArrayValue(handles);
}

std::optional<PropertyValue> SystemProperty(const SystemObject &system, uint32_t id) {
  switch (id) {
    case kvPropSys_VerMajor:
      return U32Value(KVSIM_VERSION_MAJOR);
    case kvPropSys_VerMinor:
      return U32Value(KVSIM_VERSION_MINOR);
    case kvPropSys_VerUpdate:
      return U32Value(KVSIM_VERSION_UPDATE);
    case kvPropSys_VerPhase:
      return U32Value(KVSIM_VERSION_PHASE);
    case kvPropSys_VerBuild:
      return U32Value(KVSIM_VERSION_BUILD);
    case kvPropSys_DevRefs: {
      std::vector<uint32_t> handles;
      for (uint32_t d = 1; d <= Devices().size(); ++d) {
        handles.push_back(HandleOf(SystemObject{SystemObjectKind::kDevice, system.system, d, 0}));
      }
      return HandleArrayValue(handles);
    }
    case kvPropSys_IntfRefs:
    case kvPropSys_IntfRefsAll:
      return InterfaceRefs(system.system, 0, std::nullopt);
    case kvPropSys_IntfRefsCAN:
      return InterfaceRefs(system.system, 0, kProtocolCan);
    case kvPropSys_IntfRefsFlexRay:
      return InterfaceRefs(system.system, 0, kProtocolFlexRay);
    case kvPropSys_IntfRefsLIN:
      return InterfaceRefs(system.system, 0, kProtocolLin);
    case kvPropSys_IntfRefsEthernet:
      return InterfaceRefs(system.system, 0, kProtocolEthernet);
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> DeviceProperty(const SystemObject &device, uint32_t id) {
  const DeviceRecord &record = Devices()[device.device - 1];
  switch (id) {
    case kvPropDev_Name:
      return TextValue(record.name);
    case kvPropDev_SerNum:
      return U32Value(record.serialNumber);
    case kvPropDev_ProductNum:
      return U32Value(record.productNumber);
    case kvPropDev_NumPorts:
    case kvPropDev_NumPortsAll:
      return U32Value(static_cast<uint32_t>(record.interfaces.size()));
    case kvPropDev_IntfRefs:
    case kvPropDev_IntfRefsAll:
      return InterfaceRefs(device.system, device.device, std::nullopt);
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> InterfaceProperty(const SystemObject &intf, uint32_t id) {
  const InterfaceRecord &record = Devices()[intf.device - 1].interfaces[intf.port - 1];
  switch (id) {
    case kvPropIntf_Name:
      return TextValue(record.name);
    case kvPropIntf_Protocol:
      return U32Value(record.protocol);
    case kvPropIntf_Num:
      return U32Value(record.number);
    case kvPropIntf_PortNum:
      return U32Value(intf.port);
    case kvPropIntf_DevRef:
      return U32Value(
          HandleOf(SystemObject{SystemObjectKind::kDevice, intf.system, intf.device, 0}));
    default:
      return std::nullopt;
  }
}

}  // namespace

std::optional<PropertyValue> SystemObjectProperty(const SystemObject &object, uint32_t id) {
  switch (object.kind) {
    case SystemObjectKind::kSystem:
      return SystemProperty(object, id);
    case SystemObjectKind::kDevice:
      return DeviceProperty(object, id);
    case SystemObjectKind::kInterface:
      return InterfaceProperty(object, id);
  }
  return std::nullopt;
}

Status SetSystemObjectProperty(const SystemObject &object, uint32_t id) {
  return SystemObjectProperty(object, id) ? kvsimErrPropertyReadOnly : kvsimErrPropertyUnknown;
}

}  // namespace nKvorSim
