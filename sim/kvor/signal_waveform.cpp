#include "signal_waveform.h"

#include <algorithm>
#include <cmath>
#include <optional>
#include <vector>

#include "kvsim.h"
#include "kvsvplatform.h"
#include "signal_by_name.h"
#include "signal_fill.h"
#include "signal_outputs.h"
#include "signal_properties.h"

namespace nKvorSim {

namespace {

constexpr uint32_t kBytesPerSample = 8;
constexpr double kRawPerSecond = 1e7;

// The samples that each buffer holds; every buffer must be there if it is to hold any.
Status MeasureBuffers(uint32_t count, const double *const *buffers, uint32_t bufferSize,
                      uint32_t *samples) {
  *samples = count == 0 ? 0 : bufferSize / kBytesPerSample;
  if (*samples == 0) return 0;
  if (buffers == nullptr) return kvsimErrNullPointer;
  for (uint32_t i = 0; i < count; ++i) {
    if (buffers[i] == nullptr) return kvsimErrNullPointer;
  }
  return 0;
}

Status CheckRate(double rate) {
  return std::isfinite(rate) && rate > 0.0 ? 0 : kvsimErrInvalidArgument;
}

}  // namespace

Status ReadSignalWaveform(Driver &driver, Session &session, double timeout,
                          const tWaveformRead &read) {
  const SessionDefinition &definition = session.Definition();
  if (definition.mode != kvMode_SignalInWaveform) return kvsimErrWrongMode;
  if (std::isnan(timeout)) return kvsimErrInvalidArgument;
  if (read.startTime == nullptr || read.interval == nullptr || read.numSamples == nullptr) {
    return kvsimErrNullPointer;
  }
  const uint32_t count = static_cast<uint32_t>(definition.items.size());
  uint32_t wanted = 0;
  Status status = MeasureBuffers(count, read.buffers, read.bufferSize, &wanted);
  if (status != 0) return status;
  const double rate = ResampleRate(session);
  status = CheckRate(rate);
  if (status != 0) return status;
  SignalInputs &inputs = session.SignalsIn();
  if (std::optional<uint32_t> fill = inputs.Fill()) {
    const uint32_t samples = std::min(wanted, *fill);
    for (uint32_t i = 0; i < count; ++i) {
      for (uint32_t k = 0; k < samples; ++k) read.buffers[i][k] = FillValue(i, k);
    }
    *read.startTime = driver.Clock().Now();
    *read.interval = 1.0 / rate;
    *read.numSamples = samples;
    return 0;
  }
  const uint64_t origin = definition.createdAt;
  auto due = [&] { return inputs.InstantsDue(driver.Clock().Now(), rate, origin); };
  if (timeout != 0.0 && due() < wanted) {
    status = session.Events().WaitUntil([&] { return due() >= wanted; }, timeout, driver.Blocked(),
                                        "kvhdnReadSignalWaveform");
    if (status != 0) return status;
  }
  const uint32_t samples = static_cast<uint32_t>(std::min<uint64_t>(wanted, due()));
  *read.startTime = inputs.Sample(count, samples, rate, origin, read.buffers);
  *read.interval = 1.0 / rate;
  *read.numSamples = samples;
  return 0;
}

Status WriteSignalWaveform(Driver &driver, Session &session, double timeout,
                           const double *const *buffers, uint32_t bufferSize) {
  const SessionDefinition &definition = session.Definition();
  if (definition.mode != kvMode_SignalOutWaveform) return kvsimErrWrongMode;
  if (std::isnan(timeout)) return kvsimErrInvalidArgument;
  const uint32_t count = static_cast<uint32_t>(definition.items.size());
  uint32_t samples = 0;
  Status status = MeasureBuffers(count, buffers, bufferSize, &samples);
  if (status != 0) return status;
  const double rate = ResampleRate(session);
  status = CheckRate(rate);
  if (status != 0) return status;
  const uint64_t now = driver.Clock().Now();
  if (definition.signals == nullptr) {
    std::vector<std::optional<double>> last(count);
    for (uint32_t i = 0; samples != 0 && i < count; ++i) last[i] = buffers[i][samples - 1];
    PublishLast(definition, last, now);
    return 0;
  }
  SignalOutputs &outputs = session.SignalsOut();
  const uint64_t start = outputs.WaveformStart(now);
  auto instant = [&](uint32_t k) {
    return start + static_cast<uint64_t>(std::llround(k * kRawPerSecond / rate));
  };
  std::vector<tSignalEvent> events;
  events.reserve(uint64_t{samples} * count);
  for (uint32_t k = 0; k < samples; ++k) {
    for (uint32_t i = 0; i < count; ++i)
      events.push_back(tSignalEvent{instant(k), i, buffers[i][k]});
  }
  outputs.WaveformReached(instant(samples));
  driver.Bus().TransmitStamped(session, outputs.Encode(*definition.signals, std::move(events)),
                               driver.Sessions());
  return 0;
}

}  // namespace nKvorSim
