#include "frame_properties.h"

#include "frame_items.h"
#include "inventory.h"
#include "kvorproperties.h"
#include "kvsvplatform.h"

namespace nKvorSim {

namespace {

constexpr uint32_t kJ1939 = 1;
constexpr uint32_t kJ1939PayloadMax = 1785;
constexpr uint32_t kCanFdPayloadMax = 64;
constexpr uint32_t kFlexRayPayloadMax = 254;
constexpr uint32_t kEthernetPayloadMax = 1500;

bool IsFrameMode(uint32_t mode) { return IsFrameInputMode(mode) || IsFrameOutputMode(mode); }

uint32_t DefaultPayloadLimit(const Session &session) {
  switch (session.Definition().protocol) {
    case kProtocolEthernet:
      return kEthernetPayloadMax;
    case kProtocolFlexRay:
      return kFlexRayPayloadMax;
    case kProtocolLin:
      return kFixedPayloadMax;
    default:
      if (SetU32(session, kvPropSession_ApplicationProtocol, 0) == kJ1939) return kJ1939PayloadMax;
      if (SetU32(session, kvPropSession_IntfCanIoMode, 0) != 0) return kCanFdPayloadMax;
      return kFixedPayloadMax;
  }
}

uint32_t DefaultQueueSize(const Session &session) {
  return kDefaultQueueFrames * RecordSize(PayloadLimit(session));
}

}  // namespace

uint32_t SetU32(const Session &session, uint32_t id, uint32_t fallback) {
  const std::optional<PropertyValue> stored = session.Store().Get(id);
  if (!stored || stored->size() != sizeof(uint32_t)) return fallback;
  return LoadU32(stored->data());
}

bool IsFrameInputMode(uint32_t mode) {
  return mode == kvMode_FrameInStream || mode == kvMode_FrameInQueued ||
         mode == kvMode_FrameInSinglePoint;
}

bool IsFrameOutputMode(uint32_t mode) {
  return mode == kvMode_FrameOutStream || mode == kvMode_FrameOutQueued ||
         mode == kvMode_FrameOutSinglePoint;
}

std::optional<PropertyValue> FrameReadOnlyProperty(const Session &session, uint32_t id) {
  if (id != kvPropSession_NumPend || !IsFrameInputMode(session.Definition().mode)) {
    return std::nullopt;
  }
  return U32Value(session.Frames().Pending());
}

std::optional<PropertyValue> FrameDefaultProperty(const Session &session, uint32_t id) {
  if (!IsFrameMode(session.Definition().mode)) return std::nullopt;
  switch (id) {
    case kvPropSession_PayldLenMax:
      return U32Value(DefaultPayloadLimit(session));
    case kvPropSession_QueueSize:
      return U32Value(DefaultQueueSize(session));
    case kvPropSession_IntfCanIoMode:
    case kvPropSession_ApplicationProtocol:
      return U32Value(0);
    case kvPropSession_IntfEchoTx:
      return PropertyValue{0};
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> FrameDefaultSubProperty(const Session &session, uint32_t index,
                                                     uint32_t id) {
  if (id != kvPropHidden_FramePayloadLen || !IsFrameMode(session.Definition().mode)) {
    return std::nullopt;
  }
  return U32Value(ItemPayloadLength(session, index));
}

uint32_t PayloadLimit(const Session &session) {
  return SetU32(session, kvPropSession_PayldLenMax, DefaultPayloadLimit(session));
}

uint32_t QueueCapacity(const Session &session) {
  const uint32_t bytes = SetU32(session, kvPropSession_QueueSize, DefaultQueueSize(session));
  return bytes / RecordSize(PayloadLimit(session));
}

bool EchoEnabled(const Session &session) {
  const std::optional<PropertyValue> stored = session.Store().Get(kvPropSession_IntfEchoTx);
  return stored && !stored->empty() && (*stored)[0] != 0;
}

RecordForm SessionRecordForm(const Session &session) {
  switch (session.Definition().protocol) {
    case kProtocolLin:
      return RecordForm::kFixed;
    case kProtocolCan:
      if (SetU32(session, kvPropSession_ApplicationProtocol, 0) == kJ1939 ||
          SetU32(session, kvPropSession_IntfCanIoMode, 0) != 0) {
        return RecordForm::kVariable;
      }
      return RecordForm::kFixed;
    default:
      return RecordForm::kVariable;
  }
}

uint32_t ItemPayloadLength(const Session &session, uint32_t index) {
  const std::optional<FrameItem> item = LookUpFrameItem(session.Definition().items.at(index));
  if (item && item->length) return *item->length;
  return PayloadLimit(session);
}

}  // namespace nKvorSim
