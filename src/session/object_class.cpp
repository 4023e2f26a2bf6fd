#include "session/object_class.h"

namespace nKVSVAPI100 {

uint32_t ClassFromHandle(int32_t handle) {
  const auto h = static_cast<uint32_t>(handle);
  if (h == 0) return kClassNone;
  if ((h & 0x80000000u) != 0) return (h >> 8) & 0xF0000u;
  switch (h >> 24) {
    case 0x01:
      if ((h & 0xFu) != 0) return kClassInterface;
      if ((h & 0xFFF0u) != 0) return kClassDevice;
      return kClassSystem;
    case 0x0F:
      return kClassNone;
    default:
      return kClassSession;
  }
}

}  // namespace nKVSVAPI100
