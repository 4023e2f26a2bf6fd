#include "conversion_properties.h"

#include <algorithm>

#include "frame_properties.h"
#include "inventory.h"
#include "kvorproperties.h"
#include "kvsvplatform.h"

namespace nKvorSim {

namespace {

constexpr uint32_t kJ1939 = 1;
constexpr uint32_t kJ1939PayloadMax = 1785;
constexpr uint32_t kFlexRayPayloadMax = 254;
constexpr uint32_t kBitsPerByte = 8;

uint32_t LongestFrame(const Session &session) {
  uint32_t longest = 0;
  if (const SignalLayout *layout = session.Definition().signals.get()) {
    for (const tFrameGroup &group : layout->Groups()) {
      longest = std::max(longest, static_cast<uint32_t>(group.startPayload.size()));
    }
  }
  return longest;
}

uint32_t DefaultPayloadLimit(const Session &session) {
  switch (session.Definition().protocol) {
    case kProtocolLin:
      return kFixedPayloadMax;
    case kProtocolFlexRay:
      return kFlexRayPayloadMax;
    default:
      if (SetU32(session, kvPropSession_ApplicationProtocol, 0) == kJ1939) return kJ1939PayloadMax;
      return std::max(kFixedPayloadMax, LongestFrame(session));
  }
}

}  // namespace

bool IsConversionSession(const Session &session) {
  return session.Definition().mode == kvMode_SignalConversionSinglePoint;
}

std::optional<PropertyValue> ConversionDefaultProperty(const Session &session, uint32_t id) {
  if (!IsConversionSession(session)) return std::nullopt;
  switch (id) {
    case kvPropSession_NumFrames: {
      const SignalLayout *layout = session.Definition().signals.get();
      return U32Value(layout != nullptr ? static_cast<uint32_t>(layout->Groups().size()) : 0u);
    }
    case kvPropSession_PayldLenMax:
      return U32Value(DefaultPayloadLimit(session));
    case kvPropSession_ApplicationProtocol:
      return U32Value(0);
    default:
      return std::nullopt;
  }
}

std::optional<PropertyValue> ConversionSessionSubProperty(const Session &session, uint32_t id) {
  if (id != kvPropHidden_ByteArrayBits || !IsConversionSession(session)) return std::nullopt;
  return U32Value(SessionImageBytes(session) * kBitsPerByte);
}

uint32_t ImageBytes(const tSignal &signal) {
  return (signal.numBits + kBitsPerByte - 1) / kBitsPerByte;
}

uint32_t SessionImageBytes(const Session &session) {
  uint32_t bytes = 0;
  if (const SignalLayout *layout = session.Definition().signals.get()) {
    for (const tSignalItem &item : layout->Items()) bytes += ImageBytes(*item.signal);
  }
  return bytes;
}

uint32_t ConversionPayloadLimit(const Session &session) {
  return SetU32(session, kvPropSession_PayldLenMax, DefaultPayloadLimit(session));
}

RecordForm ConversionRecordForm(const Session &session) {
  switch (session.Definition().protocol) {
    case kProtocolLin:
      return RecordForm::kFixed;
    case kProtocolFlexRay:
      return RecordForm::kVariable;
    default:
      return ConversionPayloadLimit(session) > kFixedPayloadMax ? RecordForm::kVariable
                                                                : RecordForm::kFixed;
  }
}

}  // namespace nKvorSim
