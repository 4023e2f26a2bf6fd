// Handles of the system and of its devices and interfaces. All have the top byte 0x01; the rest
// says what they name: 0x01SS0000 system SS, 0x01SSDD00 device DD of it, 0x01SSDD0P port P of
// that device. The low four bits thus tell an interface, bits 4-15 a device, neither the system.
#ifndef KVOR_SIM_SYSTEM_HANDLES_H
#define KVOR_SIM_SYSTEM_HANDLES_H

#include <cstdint>
#include <optional>

namespace nKvorSim {

enum class SystemObjectKind { kSystem, kDevice, kInterface };

struct SystemObject {
  SystemObjectKind kind;
  uint32_t system;  // 1..kMaxSystems
  uint32_t device;  // 1-based; 0 for the system
  uint32_t port;    // 1-based; 0 for the system and devices
};

constexpr uint32_t kMaxSystems = 255;

inline bool IsSystemClassHandle(uint32_t handle) { return (handle >> 24) == 0x01; }

uint32_t HandleOf(const SystemObject &object);

// What a handle names, if it has the form of a system object that the inventory holds; whether
// its system is open is not looked at.
std::optional<SystemObject> DecodeSystemHandle(uint32_t handle);

}  // namespace nKvorSim

#endif
