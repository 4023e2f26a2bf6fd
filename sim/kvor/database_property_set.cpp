// Setting the properties of database objects: each set changes the database itself, and what
// refers to a renamed object follows it.
#include <algorithm>
#include <cmath>
#include <cstring>
#include <string>
#include <vector>

#include "database_properties.h"
#include "kvorproperties.h"
#include "kvsim.h"

namespace nKvorSim {

namespace {

// Type fields of identifiers whose values the caller gives as more than plain bytes.
constexpr uint32_t kTypeHandle = 0x05;
constexpr uint32_t kTypeHandles = 0x06;
constexpr uint32_t kTypeNumbers = 0x08;

struct tCallerValue {
  PropertyValue bytes;
  uint32_t U32() const { return Read<uint32_t>(); }
  uint64_t U64() const { return Read<uint64_t>(); }
  double F64() const { return Read<double>(); }
  bool Bool() const { return bytes[0] != 0; }
  std::string Text() const { return std::string(reinterpret_cast<const char *>(bytes.data())); }
  // The 4-byte numbers of an array, handles or not.
  std::vector<uint32_t> Numbers() const {
    std::vector<uint32_t> numbers(bytes.size() / 4);
    if (!numbers.empty()) std::memcpy(numbers.data(), bytes.data(), numbers.size() * 4);
    return numbers;
  }

  template <class T>
  T Read() const {
    T value;
    std::memcpy(&value, bytes.data(), sizeof value);
    return value;
  }
};

// A new name for one of `siblings`, which must stay apart.
template <class List>
Status Rename(List &siblings, std::string *name, const std::string &wanted) {
  if (!IsIdentifier(wanted)) return kvsimErrInvalidName;
  for (const auto &sibling : siblings) {
    if (&sibling.name != name && sibling.name == wanted) return kvsimErrObjectExists;
  }
  *name = wanted;
  return 0;
}

bool IdTaken(const tCluster &cluster, const tFrame &self, uint32_t id, bool extended) {
  for (const tFrame &frame : cluster.frames) {
    if (&frame != &self && frame.id == id && frame.extended == extended) return true;
  }
  return false;
}

// The objects of `objectClass` in the object's cluster that the handles of `value` stand for, each
// by its name; a handle of anything else is kvsimErrWrongObject.
template <class NameOf>
Status NamesOfHandles(const tObjectRef &object, const tCallerValue &value, uint32_t objectClass,
                      iObjectHandles &handles, NameOf nameOf, std::vector<std::string> *names) {
  for (const uint32_t handle : value.Numbers()) {
    const tObjectRef *ref = handles.Find(handle);
    if (ref == nullptr || ref->objectClass != objectClass || ref->cluster != object.cluster) {
      return kvsimErrWrongObject;
    }
    names->push_back(nameOf(*ref));
  }
  return 0;
}

std::string FrameName(const tObjectRef &ref) { return ref.frame->name; }

// The bits of the PDU mapping: each inside the frame's payload, an update bit also none.
Status SetPduBits(tFrame &frame, const tCallerValue &value, bool update,
                  std::vector<uint32_t> *bits) {
  std::vector<uint32_t> wanted = value.Numbers();
  for (const uint32_t bit : wanted) {
    if (bit >= frame.payloadLength * 8 && !(update && bit == kNoUpdateBit)) {
      return kvsimErrInvalidArgument;
    }
  }
  *bits = std::move(wanted);
  return 0;
}

Status SetPduMapping(const tObjectRef &object, uint32_t id, const tCallerValue &value,
                     iObjectHandles &handles) {
  tFrame &frame = *object.frame;
  tPduMapping mapping = PduMappingOf(frame);
  Status status = 0;
  switch (id) {
    case kvPropFrm_PDURefs:
      mapping.pdus.clear();
      status = NamesOfHandles(object, value, kClassPdu, handles, FrameName, &mapping.pdus);
      break;
    case kvPropFrm_PDUStartBits:
      status = SetPduBits(frame, value, false, &mapping.startBits);
      break;
    default:
      status = SetPduBits(frame, value, true, &mapping.updateBits);
      break;
  }
  if (status == 0) frame.pdus = std::move(mapping);
  return status;
}

Status SetFrame(const tObjectRef &object, uint32_t id, const tCallerValue &value,
                iObjectHandles &handles) {
  tFrame &frame = *object.frame;
  switch (id) {
    case kvPropFrm_PDURefs:
    case kvPropFrm_PDUStartBits:
    case kvPropFrm_PDUUpdateBits:
      return SetPduMapping(object, id, value, handles);
    case kvPropFrm_Name: {
      const std::string old = frame.name;
      const Status status = Rename(object.cluster->frames, &frame.name, value.Text());
      if (status == 0) RenameFrameReferences(object.cluster, old, frame.name);
      return status;
    }
    case kvPropFrm_Comment:
      frame.comment = value.Text();
      return 0;
    case kvPropFrm_ID:
      if (value.U32() > MaxFrameId(frame.extended)) return kvsimErrInvalidArgument;
      if (IdTaken(*object.cluster, frame, value.U32(), frame.extended)) return kvsimErrObjectExists;
      frame.id = value.U32();
      return 0;
    case kvPropFrm_CANExtID:
      if (frame.id > MaxFrameId(value.Bool())) return kvsimErrInvalidArgument;
      if (IdTaken(*object.cluster, frame, frame.id, value.Bool())) return kvsimErrObjectExists;
      frame.extended = value.Bool();
      return 0;
    case kvPropFrm_PayloadLen:
      if (!IsValidPayloadLength(value.U32())) return kvsimErrInvalidArgument;
      frame.payloadLength = value.U32();
      if (frame.payloadLength > 8) frame.format = FrameFormat::kCanFd;
      return 0;
    case kvPropFrm_CANTxTime:
      if (!(value.F64() >= 0.0) || std::isinf(value.F64())) return kvsimErrInvalidArgument;
      frame.cycleTimeMs = value.F64() * 1000.0;
      return 0;
    case kvPropFrm_CANioMode:
      if (value.U32() > static_cast<uint32_t>(FrameFormat::kCanFd)) return kvsimErrInvalidArgument;
      // Only CAN FD carries more than 8 bytes.
      if (value.U32() == 0 && frame.payloadLength > 8) return kvsimErrInvalidArgument;
      frame.format = static_cast<FrameFormat>(value.U32());
      return 0;
    default:
      return kvsimErrPropertyReadOnly;
  }
}

Status SetSignal(const tObjectRef &object, uint32_t id, const tCallerValue &value) {
  tSignal &signal = *object.signal;
  switch (id) {
    case kvPropSig_Name:
      return Rename(object.frame->signals, &signal.name, value.Text());
    case kvPropSig_Comment:
      signal.comment = value.Text();
      return 0;
    case kvPropSig_Unit:
      signal.unit = value.Text();
      return 0;
    case kvPropSig_ByteOrdr:
      if (value.U32() > static_cast<uint32_t>(ByteOrder::kBigEndian))
        return kvsimErrInvalidArgument;
      signal.byteOrder = static_cast<ByteOrder>(value.U32());
      return 0;
    case kvPropSig_DataType:
      if (value.U32() > static_cast<uint32_t>(SignalType::kFloat)) return kvsimErrInvalidArgument;
      signal.type = static_cast<SignalType>(value.U32());
      return 0;
    case kvPropSig_NumBits:
      if (value.U32() < 1 || value.U32() > 64) return kvsimErrInvalidArgument;
      signal.numBits = value.U32();
      return 0;
    case kvPropSig_StartBit:
      if (value.U32() >= 64 * 8) return kvsimErrInvalidArgument;
      signal.startBit = value.U32();
      return 0;
    case kvPropSig_ScaleFac:
      if (value.F64() == 0.0 || !std::isfinite(value.F64())) return kvsimErrInvalidArgument;
      signal.scale = value.F64();
      return 0;
    case kvPropSig_ScaleOff:
      if (!std::isfinite(value.F64())) return kvsimErrInvalidArgument;
      signal.offset = value.F64();
      return 0;
    case kvPropSig_Min:
      signal.minimum = value.F64();
      return 0;
    case kvPropSig_Max:
      signal.maximum = value.F64();
      return 0;
    case kvPropSig_Default:
      signal.defaultRaw = (value.F64() - signal.offset) / signal.scale;
      return 0;
    case kvPropSig_MuxIsDataMux:
      if (value.Bool()) {
        const tSignal *multiplexer = FindMultiplexer(*object.frame);
        if (multiplexer != nullptr && multiplexer != &signal) return kvsimErrObjectExists;
        signal.mux = MuxRole::kMultiplexer;
      } else if (signal.mux == MuxRole::kMultiplexer) {
        signal.mux = MuxRole::kPlain;
      }
      return 0;
    case kvPropSig_MuxIsDynamic:
      if (value.Bool()) {
        signal.mux = MuxRole::kMultiplexed;
      } else if (signal.mux == MuxRole::kMultiplexed) {
        signal.mux = MuxRole::kPlain;
      }
      return 0;
    case kvPropSig_MuxValue:
      signal.muxValue = value.U32();
      return 0;
    default:
      return kvsimErrPropertyReadOnly;
  }
}

// The ECU sends exactly the frames of `value`: it becomes their transmitter, and no longer sends
// those that it sent before and that the list leaves out.
Status SetTransmitted(const tObjectRef &object, const tCallerValue &value,
                      iObjectHandles &handles) {
  std::vector<std::string> names;
  if (const Status status =
          NamesOfHandles(object, value, kClassFrame, handles, FrameName, &names)) {
    return status;
  }
  for (tFrame &frame : object.cluster->frames) {
    const bool listed = std::find(names.begin(), names.end(), frame.name) != names.end();
    if (listed) {
      frame.transmitter = object.ecu->name;
    } else if (frame.transmitter == object.ecu->name) {
      frame.transmitter.clear();
    }
  }
  return 0;
}

// The ECU receives exactly the frames of `value`: it becomes a receiver of each of their signals.
// A frame without signals has nothing that a database file could name a receiver at.
Status SetReceived(const tObjectRef &object, const tCallerValue &value, iObjectHandles &handles) {
  std::vector<std::string> names;
  if (const Status status =
          NamesOfHandles(object, value, kClassFrame, handles, FrameName, &names)) {
    return status;
  }
  const std::string &ecu = object.ecu->name;
  for (const tFrame &frame : object.cluster->frames) {
    const bool listed = std::find(names.begin(), names.end(), frame.name) != names.end();
    if (listed && frame.signals.empty()) return kvsimErrInvalidArgument;
  }
  for (tFrame &frame : object.cluster->frames) {
    const bool listed = std::find(names.begin(), names.end(), frame.name) != names.end();
    for (tSignal &signal : frame.signals) {
      auto &receivers = signal.receivers;
      const bool has = std::find(receivers.begin(), receivers.end(), ecu) != receivers.end();
      if (listed && !has) receivers.push_back(ecu);
      if (!listed)
        receivers.erase(std::remove(receivers.begin(), receivers.end(), ecu), receivers.end());
    }
  }
  return 0;
}

Status SetEcu(const tObjectRef &object, uint32_t id, const tCallerValue &value,
              iObjectHandles &handles) {
  tEcu &ecu = *object.ecu;
  switch (id) {
    case kvPropECU_Comment:
      ecu.comment = value.Text();
      return 0;
    case kvPropECU_TxFrmRefs:
      return SetTransmitted(object, value, handles);
    case kvPropECU_RxFrmRefs:
      return SetReceived(object, value, handles);
    case kvPropECU_J1939PreferredAddress:
      // 255 is the global address, which no ECU claims.
      if (value.U32() > kJ1939NullAddress) return kvsimErrInvalidArgument;
      ecu.j1939Address = value.U32();
      return 0;
    case kvPropECU_J1939NodeName:
      ecu.j1939Name = value.U64();
      return 0;
    case kvPropECU_Name:
      break;
    default:
      return kvsimErrPropertyReadOnly;
  }
  const std::string old = ecu.name;
  const Status status = Rename(object.cluster->ecus, &ecu.name, value.Text());
  if (status != 0) return status;
  // The frames name their nodes by text, so they follow the rename.
  for (tFrame &frame : object.cluster->frames) {
    if (frame.transmitter == old) frame.transmitter = ecu.name;
    for (tSignal &signal : frame.signals) {
      for (std::string &receiver : signal.receivers) {
        if (receiver == old) receiver = ecu.name;
      }
    }
  }
  return 0;
}

Status SetCluster(const tObjectRef &object, uint32_t id, const tCallerValue &value) {
  tCluster &cluster = *object.cluster;
  switch (id) {
    case kvPropClst_Name:
      return Rename(object.database->clusters, &cluster.name, value.Text());
    case kvPropClst_Comment:
      cluster.comment = value.Text();
      return 0;
    case kvPropClst_BaudRate:
      cluster.baudRate = value.U32();
      return 0;
    case kvPropClst_BaudRate64:
      cluster.baudRate = value.U64();
      return 0;
    case kvPropClst_CanFdBaudRate:
      cluster.fdBaudRate = value.U32();
      return 0;
    case kvPropClst_CanFdBaudRate64:
      cluster.fdBaudRate = value.U64();
      return 0;
    default:
      return kvsimErrPropertyReadOnly;
  }
}

// LIN frame identifiers are 6 bits; a schedule's priority is a byte, of which 255 is no one's.
constexpr uint32_t kMaxLinFrameId = 63;
constexpr uint32_t kMaxSchedulePriority = 254;
// A diagnostic entry's data fills one LIN frame at most.
constexpr size_t kMaxDiagnosticBytes = 8;

Status SetSchedule(const tObjectRef &object, uint32_t id, const tCallerValue &value) {
  tLinSchedule &schedule = *object.schedule;
  switch (id) {
    case kvPropLINSched_Name: {
      const std::string old = schedule.name;
      const Status status = Rename(object.cluster->linSchedules, &schedule.name, value.Text());
      if (status == 0) RenameScheduleReferences(object.cluster, old, schedule.name);
      return status;
    }
    case kvPropLINSched_Comment:
      schedule.comment = value.Text();
      return 0;
    case kvPropLINSched_Priority:
      if (value.U32() > kMaxSchedulePriority) return kvsimErrInvalidArgument;
      schedule.priority = value.U32();
      return 0;
    case kvPropLINSched_RunMode:
      if (value.U32() > static_cast<uint32_t>(RunMode::kNull)) return kvsimErrInvalidArgument;
      schedule.runMode = static_cast<RunMode>(value.U32());
      return 0;
    default:
      return kvsimErrPropertyReadOnly;
  }
}

Status SetEntry(const tObjectRef &object, uint32_t id, const tCallerValue &value,
                iObjectHandles &handles) {
  tLinScheduleEntry &entry = *object.entry;
  switch (id) {
    case kvPropLINSchedEntry_Name:
      return Rename(object.schedule->entries, &entry.name, value.Text());
    case kvPropLINSchedEntry_Delay:
      if (!(value.F64() >= 0.0) || !std::isfinite(value.F64())) return kvsimErrInvalidArgument;
      entry.delay = value.F64();
      return 0;
    case kvPropLINSchedEntry_EventID:
      if (value.U32() > kMaxLinFrameId) return kvsimErrInvalidArgument;
      entry.eventId = value.U32();
      return 0;
    case kvPropLINSchedEntry_Type:
      if (value.U32() > static_cast<uint32_t>(EntryType::kDiagnostic))
        return kvsimErrInvalidArgument;
      entry.type = static_cast<EntryType>(value.U32());
      return 0;
    case kvPropLINSchedEntry_NC_FF_DataBytes:
      if (value.bytes.size() > kMaxDiagnosticBytes) return kvsimErrInvalidArgument;
      entry.diagnosticBytes = value.bytes;
      return 0;
    case kvPropLINSchedEntry_Frames: {
      std::vector<std::string> names;
      const Status status = NamesOfHandles(object, value, kClassFrame, handles, FrameName, &names);
      if (status == 0) entry.frames = std::move(names);
      return status;
    }
    case kvPropLINSchedEntry_CollisionResSched: {
      // No value leaves the entry without one.
      std::vector<std::string> names;
      const Status status = NamesOfHandles(
          object, value, kClassLinSchedule, handles,
          [](const tObjectRef &ref) { return ref.schedule->name; }, &names);
      if (status == 0) entry.collisionSchedule = names.empty() ? std::string() : names.front();
      return status;
    }
    default:
      return kvsimErrPropertyReadOnly;
  }
}
}  // namespace

Status SetDatabaseProperty(const tObjectRef &object, uint32_t id, uint32_t size, const void *value,
                           iObjectHandles &handles) {
  if ((id & 0xFF0000u) != object.objectClass) return kvsimErrPropertyUnknown;
  const uint32_t type = id >> 24;
  tCallerValue caller;
  // A reference of no size is none; arrays of handles and numbers are whole 4-byte items.
  if (type == kTypeHandle && size == 0) {
    caller.bytes.clear();
  } else if (const Status status = ValueFromCaller(id, size, value, &caller.bytes)) {
    return status;
  }
  if ((type == kTypeHandles || type == kTypeNumbers) && size % 4 != 0) return kvsimErrPropertySize;
  switch (object.objectClass) {
    case kClassDatabase:
      if (id != kvPropDatabase_ShowInvalidFromOpen) return kvsimErrPropertyReadOnly;
      object.database->showInvalidFromOpen = caller.Bool();
      return 0;
    case kClassCluster:
      return SetCluster(object, id, caller);
    case kClassFrame:
      return SetFrame(object, id, caller, handles);
    case kClassPdu: {
      // A PDU's own properties are those of the frame whose payload it is.
      const uint32_t asFrame = id == kvPropPDU_Name         ? kvPropFrm_Name
                               : id == kvPropPDU_Comment    ? kvPropFrm_Comment
                               : id == kvPropPDU_PayloadLen ? kvPropFrm_PayloadLen
                                                            : 0;
      if (asFrame == 0) return kvsimErrPropertyReadOnly;
      return SetFrame(object, asFrame, caller, handles);
    }
    case kClassSignal:
      return SetSignal(object, id, caller);
    case kClassEcu:
      return SetEcu(object, id, caller, handles);
    case kClassLinSchedule:
      return SetSchedule(object, id, caller);
    case kClassLinScheduleEntry:
      return SetEntry(object, id, caller, handles);
    default:
      return kvsimErrPropertyReadOnly;
  }
}

}  // namespace nKvorSim
