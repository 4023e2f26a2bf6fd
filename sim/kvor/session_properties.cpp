#include "session_properties.h"

#include <optional>
#include <string>

#include "conversion_properties.h"
#include "frame_properties.h"
#include "kvorproperties.h"
#include "kvsim.h"
#include "property_value.h"
#include "session_reference_properties.h"
#include "signal_properties.h"

namespace nKvorSim {

namespace {

std::string JoinItems(const std::vector<std::string> &items) {
  std::string joined;
  for (const std::string &item : items) {
    if (!joined.empty()) joined += ',';
    joined += item;
  }
  return joined;
}

std::optional<PropertyValue> DefinedProperty(const SessionDefinition &definition, uint32_t id) {
  switch (id) {
    case kvPropSession_Mode:
      return U32Value(definition.mode);
    case kvPropSession_NumInList:
      return U32Value(static_cast<uint32_t>(definition.items.size()));
    case kvPropSession_List:
      return TextValue(JoinItems(definition.items));
    case kvPropSession_IntfName:
      return TextValue(definition.interfaceName);
    case kvPropSession_Protocol:
      return U32Value(definition.protocol);
    case kvPropSession_DatabaseName:
      return TextValue(definition.database);
    case kvPropSession_ClusterName:
      return TextValue(definition.cluster);
    default:
      return std::nullopt;
  }
}

// Read-only values first, then what was set, then the defaults of frame and signal sessions.
std::optional<PropertyValue> ReadOnlyProperty(const Session &session, uint32_t id) {
  if (std::optional<PropertyValue> defined = DefinedProperty(session.Definition(), id)) {
    return defined;
  }
  return FrameReadOnlyProperty(session, id);
}

std::optional<PropertyValue> PropertyOf(const Session &session, uint32_t id) {
  if (std::optional<PropertyValue> fixed = ReadOnlyProperty(session, id)) return fixed;
  if (std::optional<PropertyValue> stored = session.Store().Get(id)) return stored;
  if (std::optional<PropertyValue> reference = ReferenceDefaultProperty(session, id)) {
    return reference;
  }
  if (std::optional<PropertyValue> frame = FrameDefaultProperty(session, id)) return frame;
  if (std::optional<PropertyValue> signal = SignalDefaultProperty(session, id)) return signal;
  return ConversionDefaultProperty(session, id);
}

Status CheckIndex(const Session &session, uint32_t index) {
  return index < session.Definition().items.size() ? 0 : kvsimErrInvalidSubIndex;
}

}  // namespace

Status GetSessionPropertySize(const Session &session, uint32_t id, uint32_t *size) {
  if (size == nullptr) return kvsimErrNullPointer;
  const std::optional<PropertyValue> value = PropertyOf(session, id);
  if (!value) return kvsimErrPropertyUnknown;
  *size = static_cast<uint32_t>(value->size());
  return 0;
}

Status GetSessionProperty(const Session &session, uint32_t id, uint32_t size, void *value) {
  const std::optional<PropertyValue> stored = PropertyOf(session, id);
  if (!stored) return kvsimErrPropertyUnknown;
  // Byte settings are kept in 32-bit words: a 1-byte read of one gets its low byte.
  if (size == 1 && (id >> 24) == 0 && stored->size() == sizeof(uint32_t)) {
    return CopyValueOut(PropertyValue(stored->begin(), stored->begin() + 1), size, value);
  }
  return CopyValueOut(*stored, size, value);
}

Status SetSessionProperty(Session &session, uint32_t id, uint32_t size, const void *value) {
  if (ReadOnlyProperty(session, id)) return kvsimErrPropertyReadOnly;
  Status status = CheckReferenceProperty(session, id, size, value);
  if (status < 0) return status;
  PropertyValue bytes;
  status = ValueFromCaller(id, size, value, &bytes);
  if (status < 0) return status;
  session.Store().Set(id, std::move(bytes));
  return 0;
}

Status GetSessionSubProperty(const Session &session, uint32_t index, uint32_t id, uint32_t size,
                             void *value) {
  std::optional<PropertyValue> stored = session.Store().GetSub(index, id);
  if (!stored) stored = ConversionSessionSubProperty(session, id);
  if (!stored) {
    const Status status = CheckIndex(session, index);
    if (status < 0) return status;
    stored = FrameDefaultSubProperty(session, index, id);
  }
  if (!stored) return kvsimErrPropertyUnknown;
  return CopyValueOut(*stored, size, value);
}

Status SetSessionSubProperty(Session &session, uint32_t index, uint32_t id, uint32_t size,
                             const void *value) {
  Status status = CheckIndex(session, index);
  if (status < 0) return status;
  PropertyValue bytes;
  status = ValueFromCaller(id, size, value, &bytes);
  if (status < 0) return status;
  session.Store().SetSub(index, id, std::move(bytes));
  return 0;
}

}  // namespace nKvorSim
