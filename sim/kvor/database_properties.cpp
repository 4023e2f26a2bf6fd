#include "database_properties.h"

#include <algorithm>
#include <cstring>
#include <optional>
#include <string>
#include <vector>

#include "database_protocol_properties.h"
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

// Values of kvPropFrm_CANTimingType that a frame of a database file can have.
constexpr uint32_t kCyclicData = 0;
constexpr uint32_t kEventData = 1;

// Values of kvPropClst_ApplicationProtocol and kvPropFrm_ApplicationProtocol, and of
// kvPropClst_CanFdIsoMode.
constexpr uint32_t kNoApplicationProtocol = 0;
constexpr uint32_t kCanFdIso = 0;

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
    if (keep(signal))
      list.push_back(handles.HandleOf(SignalRef(frameRef, frameRef.frame, &signal)));
  }
  return HandleArrayValue(list);
}

bool IsMultiplexed(const tFrame &frame) { return FindMultiplexer(frame) != nullptr; }

tFrame *FrameNamed(tCluster &cluster, const std::string &name) {
  for (tFrame &frame : cluster.frames) {
    if (frame.name == name) return &frame;
  }
  return nullptr;
}

// The frames of the cluster named in `names`, as handles of `objectClass`.
PropertyValue NamedFrameHandles(const tObjectRef &from, const std::vector<std::string> &names,
                                uint32_t objectClass, iObjectHandles &handles) {
  std::vector<uint32_t> list;
  for (const std::string &name : names) {
    if (tFrame *frame = FrameNamed(*from.cluster, name)) {
      list.push_back(handles.HandleOf(FrameRef(from, frame, objectClass)));
    }
  }
  return HandleArrayValue(list);
}

// The frames that carry the PDU of `pdu`.
PropertyValue CarryingFrames(const tObjectRef &pdu, iObjectHandles &handles) {
  std::vector<uint32_t> list;
  for (tFrame &frame : pdu.cluster->frames) {
    const tPduMapping mapping = PduMappingOf(frame);
    if (std::find(mapping.pdus.begin(), mapping.pdus.end(), pdu.frame->name) !=
        mapping.pdus.end()) {
      list.push_back(handles.HandleOf(FrameRef(pdu, &frame)));
    }
  }
  return HandleArrayValue(list);
}

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
    if (id == kvPropPDU_FrmRefs) return CarryingFrames(object, handles);
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
    case kvPropFrm_CANTimingType:
      return Plain(frame.cycleTimeMs > 0.0 ? kCyclicData : kEventData);
    case kvPropFrm_ApplicationProtocol:
      return Plain(kNoApplicationProtocol);
    case kvPropFrm_PDURefs:
      return NamedFrameHandles(object, PduMappingOf(frame).pdus, kClassPdu, handles);
    case kvPropFrm_PDUStartBits:
      return HandleArrayValue(PduMappingOf(frame).startBits);
    case kvPropFrm_PDUUpdateBits:
      return HandleArrayValue(PduMappingOf(frame).updateBits);
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
    case kvPropSubfrm_ConfigStatus:
      for (const tSignal &signal : object.frame->signals) {
        const bool own =
            signal.mux == MuxRole::kMultiplexed && signal.muxValue == subframe.muxValue;
        if (own && !SignalFits(signal, object.frame->payloadLength)) {
          return Plain(static_cast<uint32_t>(kvsimErrSignalLayout));
        }
      }
      return Plain(uint32_t{0});
    case kvPropSubfrm_DynSigRefs:
      return SignalHandles(object, handles, [&](const tSignal &s) {
        return s.mux == MuxRole::kMultiplexed && s.muxValue == subframe.muxValue;
      });
    default:
      return std::nullopt;
  }
}

tObjectRef ScheduleRef(const tObjectRef &from, tLinSchedule *schedule) {
  tObjectRef ref = ClusterRef(from);
  ref.objectClass = kClassLinSchedule;
  ref.schedule = schedule;
  return ref;
}

std::optional<PropertyValue> EntryProperty(const tObjectRef &object, uint32_t id,
                                           iObjectHandles &handles) {
  const tLinScheduleEntry &entry = *object.entry;
  switch (id) {
    case kvPropLINSchedEntry_Delay:
      return Plain(entry.delay);
    case kvPropLINSchedEntry_EventID:
      return Plain(entry.eventId);
    case kvPropLINSchedEntry_Type:
      return Plain(static_cast<uint32_t>(entry.type));
    case kvPropLINSchedEntry_Frames:
      return NamedFrameHandles(object, entry.frames, kClassFrame, handles);
    case kvPropLINSchedEntry_NC_FF_DataBytes:
      return PropertyValue(entry.diagnosticBytes);
    case kvPropLINSchedEntry_CollisionResSched:
      // An entry that resolves no collisions has no value here.
      for (tLinSchedule &schedule : object.cluster->linSchedules) {
        if (!entry.collisionSchedule.empty() && schedule.name == entry.collisionSchedule) {
          return Plain(handles.HandleOf(ScheduleRef(object, &schedule)));
        }
      }
      return std::nullopt;
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
      case kvPropLINSchedEntry_Sched:
        return Plain(handles.HandleOf(ScheduleRef(object, object.schedule)));
      default:
        return EntryProperty(object, id, handles);
    }
  }
  switch (id) {
    case kvPropLINSched_Name:
      return TextValue(object.schedule->name);
    case kvPropLINSched_Comment:
      return TextValue(object.schedule->comment);
    case kvPropLINSched_Priority:
      return Plain(object.schedule->priority);
    case kvPropLINSched_RunMode:
      return Plain(static_cast<uint32_t>(object.schedule->runMode));
    case kvPropLINSched_ConfigStatus:
      return Plain(uint32_t{0});
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
    case kvPropECU_J1939PreferredAddress:
      return Plain(ecu.j1939Address);
    case kvPropECU_J1939NodeName:
      return Plain(ecu.j1939Name);
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
    case kvPropClst_ApplicationProtocol:
      return Plain(kNoApplicationProtocol);
    case kvPropClst_CanFdIsoMode:
      return Plain(kCanFdIso);
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

}  // namespace

Status GetDatabaseProperty(const tObjectRef &object, uint32_t id, iObjectHandles &handles,
                           PropertyValue *value) {
  // A property of another class never belongs to the object.
  if ((id & 0xFF0000u) != object.objectClass) return kvsimErrPropertyUnknown;
  // Every cluster here is a CAN cluster.
  if (IsFlexRayOrLinProperty(id)) return kvsimErrWrongProtocol;
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

}  // namespace nKvorSim
