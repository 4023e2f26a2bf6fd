// An object of an open database as a handle stands for it: its class and the chain of objects
// that hold it, so that each property finds what it describes without a search.
#ifndef KVOR_SIM_DATABASE_OBJECT_H
#define KVOR_SIM_DATABASE_OBJECT_H

#include <cstdint>

#include "database_model.h"

namespace nKvorSim {

// Class codes of database objects, as in the class field of a property identifier.
constexpr uint32_t kClassDatabase = 0x00000;
constexpr uint32_t kClassCluster = 0x10000;
constexpr uint32_t kClassFrame = 0x20000;
constexpr uint32_t kClassSignal = 0x30000;
constexpr uint32_t kClassSubframe = 0x40000;
constexpr uint32_t kClassEcu = 0x50000;
constexpr uint32_t kClassLinSchedule = 0x60000;
constexpr uint32_t kClassLinScheduleEntry = 0x70000;
constexpr uint32_t kClassPdu = 0x80000;  // the PDU of a frame: the frame's own payload

struct tObjectRef {
  uint32_t objectClass = kClassDatabase;
  tDatabase *database = nullptr;
  tCluster *cluster = nullptr;
  tFrame *frame = nullptr;  // for a frame, its PDU, its subframes and its signals
  tSignal *signal = nullptr;
  tSubframe *subframe = nullptr;
  tEcu *ecu = nullptr;
  tLinSchedule *schedule = nullptr;  // for a schedule and its entries
  tLinScheduleEntry *entry = nullptr;
};

// The object itself, which tells it apart from every other object of its class.
inline const void *ObjectOf(const tObjectRef &ref) {
  switch (ref.objectClass) {
    case kClassCluster:
      return ref.cluster;
    case kClassFrame:
    case kClassPdu:
      return ref.frame;
    case kClassSignal:
      return ref.signal;
    case kClassSubframe:
      return ref.subframe;
    case kClassEcu:
      return ref.ecu;
    case kClassLinSchedule:
      return ref.schedule;
    case kClassLinScheduleEntry:
      return ref.entry;
    default:
      return ref.database;
  }
}

// Hands out the handle of an object, the same for as long as the object lives, and finds the
// object of a handle that a caller gives back.
class iObjectHandles {
 public:
  virtual uint32_t HandleOf(const tObjectRef &ref) = 0;
  // Null for a handle of no object of the same database.
  virtual const tObjectRef *Find(uint32_t handle) = 0;

 protected:
  ~iObjectHandles() = default;
};

}  // namespace nKvorSim

#endif
