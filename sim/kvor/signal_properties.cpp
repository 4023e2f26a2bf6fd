#include "signal_properties.h"

#include <cstring>

#include "kvorproperties.h"
#include "kvsvplatform.h"

namespace nKvorSim {

namespace {

bool IsWaveformMode(uint32_t mode) {
  return mode == kvMode_SignalInWaveform || mode == kvMode_SignalOutWaveform;
}

bool QueuesPairs(uint32_t mode) {
  return mode == kvMode_SignalInWaveform || mode == kvMode_SignalInXY;
}

PropertyValue F64Value(double value) {
  PropertyValue bytes(sizeof value);
  std::memcpy(bytes.data(), &value, sizeof value);
  return bytes;
}

}  // namespace

bool IsSignalInputMode(uint32_t mode) {
  return mode == kvMode_SignalInSinglePoint || mode == kvMode_SignalInWaveform ||
         mode == kvMode_SignalInXY;
}

std::optional<PropertyValue> SignalDefaultProperty(const Session &session, uint32_t id) {
  const uint32_t mode = session.Definition().mode;
  if (id == kvPropSession_ResampRate && IsWaveformMode(mode)) {
    return F64Value(kDefaultResampleRate);
  }
  if (id == kvPropSession_QueueSize && QueuesPairs(mode)) return U32Value(kDefaultSignalQueue);
  return std::nullopt;
}

// Sizes are checked when a value is set: a stored value has the size of its type.
double ResampleRate(const Session &session) {
  const std::optional<PropertyValue> stored = session.Store().Get(kvPropSession_ResampRate);
  if (!stored || stored->size() != sizeof(double)) return kDefaultResampleRate;
  double rate;
  std::memcpy(&rate, stored->data(), sizeof rate);
  return rate;
}

uint32_t SignalQueueCapacity(const Session &session) {
  const std::optional<PropertyValue> stored = session.Store().Get(kvPropSession_QueueSize);
  if (!stored || stored->size() != sizeof(uint32_t)) return kDefaultSignalQueue;
  uint32_t capacity;
  std::memcpy(&capacity, stored->data(), sizeof capacity);
  return capacity;
}

}  // namespace nKvorSim
