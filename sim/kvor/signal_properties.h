// The properties that a signal session has before anyone sets them, and what the signal calls
// take from them. A value set with kvSetProperty wins over the default.
//
//   kvPropSession_ResampRate   waveform sessions (modes 1 and 4): 1000.0 samples per second
//   kvPropSession_QueueSize    input XY and waveform sessions (modes 1 and 2): pairs that each
//                              signal keeps until a read takes them, kDefaultSignalQueue
#ifndef KVOR_SIM_SIGNAL_PROPERTIES_H
#define KVOR_SIM_SIGNAL_PROPERTIES_H

#include <cstdint>
#include <optional>

#include "property_value.h"
#include "session.h"

namespace nKvorSim {

constexpr uint32_t kDefaultSignalQueue = 4096;
constexpr double kDefaultResampleRate = 1000.0;

bool IsSignalInputMode(uint32_t mode);

// The default of a settable signal property; nothing for any other identifier or session.
std::optional<PropertyValue> SignalDefaultProperty(const Session &session, uint32_t id);

// Samples per second of a waveform session.
double ResampleRate(const Session &session);
// Pairs per signal that an input session keeps.
uint32_t SignalQueueCapacity(const Session &session);

}  // namespace nKvorSim

#endif
