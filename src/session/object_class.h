// Object classes of handles: the class of a database object is also the class field of its
// property identifiers.
#ifndef KVSVAPI_SESSION_OBJECT_CLASS_H
#define KVSVAPI_SESSION_OBJECT_CLASS_H

#include <cstdint>

namespace nKVSVAPI100 {

enum eObjectClass : uint32_t {
  kClassDatabase = 0,
  kClassCluster = 0x10000,
  kClassFrame = 0x20000,
  kClassSignal = 0x30000,
  kClassSubframe = 0x40000,
  kClassEcu = 0x50000,
  kClassLinSchedule = 0x60000,
  kClassLinScheduleEntry = 0x70000,
  kClassPdu = 0x80000,
  kClassBareDatabase = 0xF0000,  // close dispatch only
  kClassSession = 0x100000,
  kClassSystem = 0x110000,
  kClassDevice = 0x120000,
  kClassInterface = 0x130000,
  kClassNone = 0xFF0000
};

// Top bit set: a database object, class in bits 24-27. Top byte 0x01: system, device (bits 4-15)
// or interface (bits 0-3). 0 and top byte 0x0F: no class. Anything else: a session.
uint32_t ClassFromHandle(int32_t handle);

}  // namespace nKVSVAPI100

#endif
