#include "database_properties.h"

#include <cmath>
#include <cstring>
#include <optional>
#include <string>
#include <vector>

#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvplatform.h"
#include "signal_codec.h"

namespace nKvorSim {

namespace {

// The cluster references of a signal, a subframe and a LIN schedule entry, which have no names.
constexpr uint32_t kSignalClusterRef = 0x05030034u;
constexpr uint32_t kSubframeClusterRef = 0x05040006u;
constexpr uint32_t kEntryClusterRef = 0x05070009u;

// A PDU of a classic frame starts with the frame and has no update bit.
constexpr uint32_t kPduStartBit = 0;
constexpr uint32_t kNoUpdateBit = 0xFFFFFFFFu;

template <class T>
PropertyValue Plain(T value) {
  PropertyValue bytes(sizeof value);
  std::memcpy(bytes.data(), &value, sizeof value);
  return bytes;
}

PropertyValue BoolValue(bool value) { return PropertyValue{static_cast<uint8_t>(value ? 1 : 0)}; }

tObjectRef Child(const tObjectRef &parent, uint32_t objectClass) {
  tObjectRef child = parent;
  child.objectClass = objectClass;
  return child;
}

tObjectRef ClusterRef(const tObjectRef &from) {
  tObjectRef ref;
  ref.objectClass = kClassCluster;
  ref.database = from.database;
  ref.cluster = from.cluster;
  return ref;
}

tObjectRef FrameRef(const tObjectRef &from, tFrame *frame, uint32_t objectClass = kClassFrame) {
  tObjectRef ref = ClusterRef(from);
  ref.objectClass = objectClass;
  ref.frame = frame;
  return ref;
}

tObjectRef SignalRef(const tObjectRef &from, tFrame *frame, tSignal *signal) {
  tObjectRef ref = FrameRef(from, frame, kClassSignal);
  ref.signal = signal;
  return ref;
}

// The signals of a frame that pass `keep`, as handles.
template <class Keep>
PropertyValue SignalHandles(const tObjectRef &frameRef, iObjectHandles &handles, Keep keep) {
  std::vector<uint32_t> list;
  for (tSignal &signal : frameRef.frame->signals) {
    if (keep(signal)) list.push_back(handles.HandleOf(SignalRef(frameRef, frameRef.frame, &signal)));
  }
  return HandleArrayValue(list);
}

bool IsMultiplexed(const tFrame &frame) { return FindMultiplexer(frame) != nullptr; }

PropertyValue SubframeHandles(const tObjectRef &frameRef, iObjectHandles &handles) {
  AddMissingSubframes(frameRef.frame);
  std::vector<uint32_t> list;
  for (tSubframe &subframe : frameRef.frame->subframes) {
    tObjectRef ref = FrameRef(frameRef, frameRef.frame, kClassSubframe);
    ref.subframe = &subframe;
    list.push_back(handles.HandleOf(ref));
  }
  return HandleArrayValue(list);
}

Status FrameConfigStatus(const tFrame &frame) {
  bool multiplexed = false;
  for (const tSignal &signal : frame.signals) {
    if (!SignalFits(signal, frame.payloadLength)) return kvsimErrSignalLayout;
    multiplexed = multiplexed || signal.mux == MuxRole::kMultiplexed;
  }
  return multiplexed && !IsMultiplexed(frame) ? kvsimErrSignalLayout : 0;
}

// A signal's start value as bits: it is raw already, so no scale or offset applies.
uint64_t StartBits(const tSignal &signal) {
  tSignal rawDomain = signal;
  rawDomain.scale = 1.0;
  rawDomain.offset = 0.0;
  return PhysicalToRaw(rawDomain, signal.defaultRaw);
}

// The payload that a frame carries before any value is written: each signal at its start value,
// of the multiplexed ones those that the multiplexer's start value selects.
PropertyValue DefaultPayload(const tFrame &frame) {
  PropertyValue payload(frame.payloadLength, 0);
  const tSignal *multiplexer = FindMultiplexer(frame);
  const uint64_t selected = multiplexer != nullptr ? StartBits(*multiplexer) : 0;
  for (const tSignal &signal : frame.signals) {
    if (!SignalFits(signal, frame.payloadLength)) continue;
    if (signal.mux == MuxRole::kMultiplexed &&
        (multiplexer == nullptr || signal.muxValue != selected)) {
      continue;
    }
    InsertRaw(signal, StartBits(signal), payload.data());
  }
  return payload;
}

std::optional<PropertyValue> FrameOrPduProperty(const tObjectRef &object, uint32_t id,
                                                iObjectHandles &handles) {
  tFrame &frame = *object.frame;
  const tObjectRef pdu = FrameRef(object, object.frame, kClassPdu);
  const tObjectRef asFrame = FrameRef(object, object.frame);
  switch (id) {
    case kvPropFrm_ClusterRef:
    case kvPropPDU_ClusterRef:
      return Plain(handles.HandleOf(ClusterRef(object)));
    case kvPropFrm_Comment:
    case kvPropPDU_Comment:
      return TextValue(frame.comment);
    case kvPropFrm_Name:
    case kvPropPDU_Name:
      return TextValue(frame.name);
    case kvPropFrm_DefaultPayload:
    case kvPropPDU_DefaultPayload:
      return DefaultPayload(frame);
    case kvPropFrm_PayloadLen:
    case kvPropPDU_PayloadLen:
      return Plain(frame.payloadLength);
    case kvPropFrm_SigRefs:
    case kvPropPDU_SigRefs:
      return SignalHandles(object, handles, [](const tSignal &) { return true; });
    case kvPropFrm_ConfigStatus:
    case kvPropPDU_ConfigStatus:
      return Plain(static_cast<uint32_t>(FrameConfigStatus(frame)));
    case kvPropFrm_MuxIsMuxed:
    case kvPropPDU_MuxIsMuxed:
      return BoolValue(IsMultiplexed(frame));
    case kvPropFrm_MuxDataMuxSigRef:
    case kvPropPDU_MuxDataMuxSigRef: {
      tSignal *multiplexer = const_cast<tSignal *>(FindMultiplexer(frame));
      if (multiplexer == nullptr) return std::nullopt;
      return Plain(handles.HandleOf(SignalRef(object, object.frame, multiplexer)));
    }
    case kvPropFrm_MuxStaticSigRefs:
    case kvPropPDU_MuxStaticSigRefs:
      return SignalHandles(object, handles,
                           [](const tSignal &s) { return s.mux != MuxRole::kMultiplexed; });
    case kvPropFrm_MuxSubframeRefs:
    case kvPropPDU_MuxSubframeRefs:
      return SubframeHandles(object, handles);
    default:
      break;
  }
  if (object.objectClass == kClassPdu) {
    if (id == kvPropPDU_FrmRefs) return HandleArrayValue({handles.HandleOf(asFrame)});
    return std::nullopt;
  }
  switch (id) {
    case kvPropFrm_ID:
      return Plain(frame.id);
    case kvPropFrm_CANExtID:
      return BoolValue(frame.extended);
    case kvPropFrm_CANTxTime:
      return Plain(frame.cycleTimeMs / 1000.0);
    case kvPropFrm_CANioMode:
      return Plain(static_cast<uint32_t>(frame.format));
    case kvPropFrm_PDURefs:
      return HandleArrayValue({handles.HandleOf(pdu)});
    case kvPropFrm_PDUStartBits:
      return HandleArrayValue({kPduStartBit});
    case kvPropFrm_PDUUpdateBits:
      return HandleArrayValue({kNoUpdateBit});
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> SignalProperty(const tObjectRef &object, uint32_t id,
                                            iObjectHandles &handles) {
  const tSignal &signal = *object.signal;
  switch (id) {
    case kvPropSig_ByteOrdr:
      return Plain(static_cast<uint32_t>(signal.byteOrder));
    case kvPropSig_Comment:
      return TextValue(signal.comment);
    case kvPropSig_DataType:
      return Plain(static_cast<uint32_t>(signal.type));
    case kvPropSig_Default:
      return Plain(signal.defaultRaw * signal.scale + signal.offset);
    case kvPropSig_FrameRef:
      return Plain(handles.HandleOf(FrameRef(object, object.frame)));
    case kvPropSig_PDURef:
      return Plain(handles.HandleOf(FrameRef(object, object.frame, kClassPdu)));
    case kvPropSig_Max:
      return Plain(signal.maximum);
    case kvPropSig_Min:
      return Plain(signal.minimum);
    case kvPropSig_Name:
      return TextValue(signal.name);
    case kvPropSig_NameUniqueToCluster:
      return TextValue(object.frame->name + "." + signal.name);
    case kvPropSig_ConfigStatus:
      return Plain(static_cast<uint32_t>(
          SignalFits(signal, object.frame->payloadLength) ? 0 : kvsimErrSignalLayout));
    case kvPropSig_NumBits:
      return Plain(signal.numBits);
    case kvPropSig_ScaleFac:
      return Plain(signal.scale);
    case kvPropSig_ScaleOff:
      return Plain(signal.offset);
    case kvPropSig_StartBit:
      return Plain(signal.startBit);
    case kvPropSig_Unit:
      return TextValue(signal.unit);
    case kvPropSig_MuxIsDataMux:
      return BoolValue(signal.mux == MuxRole::kMultiplexer);
    case kvPropSig_MuxIsDynamic:
      return BoolValue(signal.mux == MuxRole::kMultiplexed);
    case kvPropSig_MuxValue:
      return Plain(signal.muxValue);
    case kSignalClusterRef:
      return Plain(handles.HandleOf(ClusterRef(object)));
    case kvPropSig_MuxSubfrmRef: {
      if (signal.mux != MuxRole::kMultiplexed) return std::nullopt;
      AddMissingSubframes(object.frame);
      for (tSubframe &subframe : object.frame->subframes) {
        if (subframe.muxValue != signal.muxValue) continue;
        tObjectRef ref = FrameRef(object, object.frame, kClassSubframe);
        ref.subframe = &subframe;
        return Plain(handles.HandleOf(ref));
      }
      return std::nullopt;
    }
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> SubframeProperty(const tObjectRef &object, uint32_t id,
                                              iObjectHandles &handles) {
  const tSubframe &subframe = *object.subframe;
  switch (id) {
    case kvPropSubfrm_Name:
      return TextValue(subframe.name);
    case kvPropSubfrm_NameUniqueToCluster:
      return TextValue(object.frame->name + "." + subframe.name);
    case kSubframeClusterRef:
      return Plain(handles.HandleOf(ClusterRef(object)));
    case kvPropSubfrm_FrmRef:
      return Plain(handles.HandleOf(FrameRef(object, object.frame)));
    case kvPropSubfrm_PDURef:
      return Plain(handles.HandleOf(FrameRef(object, object.frame, kClassPdu)));
    case kvPropSubfrm_MuxValue:
      return Plain(subframe.muxValue);
    case kvPropSubfrm_DynSigRefs:
      return SignalHandles(object, handles, [&](const tSignal &s) {
        return s.mux == MuxRole::kMultiplexed && s.muxValue == subframe.muxValue;
      });
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> ScheduleProperty(const tObjectRef &object, uint32_t id,
                                              iObjectHandles &handles) {
  if (object.objectClass == kClassLinScheduleEntry) {
    switch (id) {
      case kvPropLINSchedEntry_Name:
        return TextValue(object.entry->name);
      case kvPropLINSchedEntry_NameUniqueToCluster:
        return TextValue(object.schedule->name + "." + object.entry->name);
      case kEntryClusterRef:
        return Plain(handles.HandleOf(ClusterRef(object)));
      case kvPropLINSchedEntry_Sched: {
        tObjectRef schedule = ClusterRef(object);
        schedule.objectClass = kClassLinSchedule;
        schedule.schedule = object.schedule;
        return Plain(handles.HandleOf(schedule));
      }
      default:
        return std::nullopt;
    }
  }
  switch (id) {
    case kvPropLINSched_Name:
      return TextValue(object.schedule->name);
    case kvPropLINSched_ClstRef:
      return Plain(handles.HandleOf(ClusterRef(object)));
    case kvPropLINSched_Entries: {
      std::vector<uint32_t> list;
      for (tLinScheduleEntry &entry : object.schedule->entries) {
        tObjectRef ref = object;
        ref.objectClass = kClassLinScheduleEntry;
        ref.entry = &entry;
        list.push_back(handles.HandleOf(ref));
      }
      return HandleArrayValue(list);
    }
    default:
      return std::nullopt;
  }
}

bool Receives(const tFrame &frame, const std::string &ecu) {
  for (const tSignal &signal : frame.signals) {
    for (const std::string &receiver : signal.receivers) {
      if (receiver == ecu) return true;
    }
  }
  return false;
}

std::optional<PropertyValue> EcuProperty(const tObjectRef &object, uint32_t id,
                                         iObjectHandles &handles) {
  const tEcu &ecu = *object.ecu;
  const auto frames = [&](bool transmitted) {
    std::vector<uint32_t> list;
    for (tFrame &frame : object.cluster->frames) {
      const bool match = transmitted ? frame.transmitter == ecu.name : Receives(frame, ecu.name);
      if (match) list.push_back(handles.HandleOf(FrameRef(object, &frame)));
    }
    return HandleArrayValue(list);
  };
  switch (id) {
    case kvPropECU_ClstRef:
      return Plain(handles.HandleOf(ClusterRef(object)));
    case kvPropECU_Name:
      return TextValue(ecu.name);
    case kvPropECU_Comment:
      return TextValue(ecu.comment);
    case kvPropECU_ConfigStatus:
      return Plain(uint32_t{0});
    case kvPropECU_TxFrmRefs:
      return frames(true);
    case kvPropECU_RxFrmRefs:
      return frames(false);
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> ClusterProperty(const tObjectRef &object, uint32_t id,
                                             iObjectHandles &handles) {
  tCluster &cluster = *object.cluster;
  std::vector<uint32_t> list;
  switch (id) {
    case kvPropClst_Name:
      return TextValue(cluster.name);
    case kvPropClst_Comment:
      return TextValue(cluster.comment);
    case kvPropClst_DatabaseRef: {
      tObjectRef database;
      database.database = object.database;
      return Plain(handles.HandleOf(database));
    }
    case kvPropClst_Protocol:
      return Plain(static_cast<uint32_t>(kvProtocol_CAN));
    case kvPropClst_ConfigStatus:
      return Plain(uint32_t{0});
    case kvPropClst_PDUsReqd:
      return BoolValue(false);
    case kvPropClst_BaudRate:
      if (cluster.baudRate > UINT32_MAX) return std::nullopt;
      return Plain(static_cast<uint32_t>(cluster.baudRate));
    case kvPropClst_BaudRate64:
      return Plain(cluster.baudRate);
    case kvPropClst_CanFdBaudRate:
      if (cluster.fdBaudRate > UINT32_MAX) return std::nullopt;
      return Plain(static_cast<uint32_t>(cluster.fdBaudRate));
    case kvPropClst_CanFdBaudRate64:
      return Plain(cluster.fdBaudRate);
    case kvPropClst_CanIoMode: {
      FrameFormat mode = FrameFormat::kCan;
      for (const tFrame &frame : cluster.frames) {
        if (frame.format == FrameFormat::kCanFd) mode = FrameFormat::kCanFd;
      }
      return Plain(static_cast<uint32_t>(mode));
    }
    case kvPropClst_FrmRefs:
    case kvPropClst_PDURefs: {
      const uint32_t objectClass = id == kvPropClst_FrmRefs ? kClassFrame : kClassPdu;
      for (tFrame &frame : cluster.frames) {
        list.push_back(handles.HandleOf(FrameRef(object, &frame, objectClass)));
      }
      return HandleArrayValue(list);
    }
    case kvPropClst_SigRefs:
      for (tFrame &frame : cluster.frames) {
        for (tSignal &signal : frame.signals) {
          list.push_back(handles.HandleOf(SignalRef(object, &frame, &signal)));
        }
      }
      return HandleArrayValue(list);
    case kvPropClst_LINSchedules:
      for (tLinSchedule &schedule : cluster.linSchedules) {
        tObjectRef ref = ClusterRef(object);
        ref.objectClass = kClassLinSchedule;
        ref.schedule = &schedule;
        list.push_back(handles.HandleOf(ref));
      }
      return HandleArrayValue(list);
    case kvPropClst_ECURefs:
      for (tEcu &ecu : cluster.ecus) {
        tObjectRef ref = ClusterRef(object);
        ref.objectClass = kClassEcu;
        ref.ecu = &ecu;
        list.push_back(handles.HandleOf(ref));
      }
      return HandleArrayValue(list);
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> DatabaseProperty(const tObjectRef &object, uint32_t id,
                                              iObjectHandles &handles) {
  switch (id) {
    case kvPropDatabase_Name:
      return TextValue(object.database->name);
    case kvPropDatabase_ShowInvalidFromOpen:
      return BoolValue(object.database->showInvalidFromOpen);
    case kvPropDatabase_ClstRefs: {
      std::vector<uint32_t> list;
      for (tCluster &cluster : object.database->clusters) {
        tObjectRef ref = Child(object, kClassCluster);
        ref.cluster = &cluster;
        list.push_back(handles.HandleOf(ref));
      }
      return HandleArrayValue(list);
    }
    default:
      return std::nullopt;
  }
}

// ---- Setting ----------------------------------------------------------------------------------

struct tCallerValue {
  PropertyValue bytes;
  uint32_t U32() const { return Read<uint32_t>(); }
  uint64_t U64() const { return Read<uint64_t>(); }
  double F64() const { return Read<double>(); }
  bool Bool() const { return bytes[0] != 0; }
  std::string Text() const { return std::string(reinterpret_cast<const char *>(bytes.data())); }

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

Status SetFrame(const tObjectRef &object, uint32_t id, const tCallerValue &value) {
  tFrame &frame = *object.frame;
  switch (id) {
    case kvPropFrm_Name:
      return Rename(object.cluster->frames, &frame.name, value.Text());
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
      if (value.U32() > static_cast<uint32_t>(ByteOrder::kBigEndian)) return kvsimErrInvalidArgument;
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

Status SetEcu(const tObjectRef &object, uint32_t id, const tCallerValue &value) {
  tEcu &ecu = *object.ecu;
  if (id == kvPropECU_Comment) {
    ecu.comment = value.Text();
    return 0;
  }
  if (id != kvPropECU_Name) return kvsimErrPropertyReadOnly;
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

}  // namespace

Status GetDatabaseProperty(const tObjectRef &object, uint32_t id, iObjectHandles &handles,
                           PropertyValue *value) {
  // A property of another class never belongs to the object.
  if ((id & 0xFF0000u) != object.objectClass) return kvsimErrPropertyUnknown;
  std::optional<PropertyValue> found;
  switch (object.objectClass) {
    case kClassDatabase:
      found = DatabaseProperty(object, id, handles);
      break;
    case kClassCluster:
      found = ClusterProperty(object, id, handles);
      break;
    case kClassFrame:
    case kClassPdu:
      found = FrameOrPduProperty(object, id, handles);
      break;
    case kClassSignal:
      found = SignalProperty(object, id, handles);
      break;
    case kClassEcu:
      found = EcuProperty(object, id, handles);
      break;
    case kClassSubframe:
      found = SubframeProperty(object, id, handles);
      break;
    case kClassLinSchedule:
    case kClassLinScheduleEntry:
      found = ScheduleProperty(object, id, handles);
      break;
    default:
      break;
  }
  if (!found) return kvsimErrPropertyUnknown;
  *value = std::move(*found);
  return 0;
}

Status SetDatabaseProperty(const tObjectRef &object, uint32_t id, uint32_t size,
                           const void *value) {
  if ((id & 0xFF0000u) != object.objectClass) return kvsimErrPropertyUnknown;
  tCallerValue caller;
  const Status status = ValueFromCaller(id, size, value, &caller.bytes);
  if (status != 0) return status;
  // Types without a fixed size come back as they were given; only text can be set among them.
  const uint32_t type = id >> 24;
  if (type != 0x00 && type != 0x01 && type != 0x02 && type != 0x03 && type != 0x09) {
    return kvsimErrPropertyReadOnly;
  }
  switch (object.objectClass) {
    case kClassDatabase:
      if (id != kvPropDatabase_ShowInvalidFromOpen) return kvsimErrPropertyReadOnly;
      object.database->showInvalidFromOpen = caller.Bool();
      return 0;
    case kClassCluster:
      return SetCluster(object, id, caller);
    case kClassFrame:
      return SetFrame(object, id, caller);
    case kClassSignal:
      return SetSignal(object, id, caller);
    case kClassEcu:
      return SetEcu(object, id, caller);
    default:
      return kvsimErrPropertyReadOnly;
  }
}

}  // namespace nKvorSim
