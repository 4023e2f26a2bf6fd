#include "conversions.h"

#include <vector>

#include "conversion_properties.h"
#include "frame_encoding.h"
#include "kvsim.h"
#include "signal_codec.h"
#include "signal_outputs.h"

namespace nKvorSim {

namespace {

constexpr uint32_t kBytesPerValue = 8;

// The layout of a session that can convert; a session with signals and no database to find them
// in cannot.
Status ConversionLayout(const Session &session, const SignalLayout **layout) {
  if (!IsConversionSession(session)) return kvsimErrWrongMode;
  *layout = session.Definition().signals.get();
  if (*layout == nullptr && !session.Definition().items.empty()) return kvsimErrObjectNotFound;
  return 0;
}

uint32_t SignalCount(const SignalLayout *layout) {
  return layout != nullptr ? static_cast<uint32_t>(layout->Items().size()) : 0u;
}

// The frames of the session's groups that carry `values`, as the session's records.
Status WriteFrames(const Session &session, const SignalLayout *layout, uint64_t now,
                   const std::vector<double> &values, const tRecordsOut &out) {
  if (out.bytesReturned == nullptr) return kvsimErrNullPointer;
  *out.bytesReturned = 0;
  if (layout == nullptr) return 0;
  std::vector<tSignalEvent> events;
  events.reserve(values.size());
  for (uint32_t i = 0; i < values.size(); ++i) events.push_back(tSignalEvent{now, i, values[i]});
  // A fresh set of payloads: every conversion starts from the signals' start values.
  SignalOutputs outputs;
  const std::vector<Frame> frames = outputs.Encode(*layout, std::move(events));
  const RecordForm form = ConversionRecordForm(session);
  uint64_t total = 0;
  for (const Frame &frame : frames) total += EncodedSize(frame, form);
  if (total > out.size) return kvsimErrBufferTooSmall;
  if (total != 0 && out.buffer == nullptr) return kvsimErrNullPointer;
  auto *at = static_cast<uint8_t *>(out.buffer);
  for (const Frame &frame : frames) {
    EncodeRecord(frame, form, at);
    at += EncodedSize(frame, form);
  }
  *out.bytesReturned = static_cast<uint32_t>(total);
  return 0;
}

// Calls `take(index, value, time)` for each signal that a record of `size` bytes carries.
template <class Take>
Status ReadFrames(const Session &session, const SignalLayout *layout, const void *records,
                  uint32_t size, Take take) {
  if (size != 0 && records == nullptr) return kvsimErrNullPointer;
  std::vector<Frame> frames;
  const Status status =
      DecodeRecords(static_cast<const uint8_t *>(records), size, ConversionRecordForm(session),
                    ConversionPayloadLimit(session), &frames);
  if (status < 0 || layout == nullptr) return status;
  for (const Frame &frame : frames) {
    layout->Decode(frame,
                   [&](uint32_t index, double value) { take(index, value, frame.timestamp); });
  }
  return 0;
}

// Offset of each signal's bytes in the session's image.
std::vector<uint32_t> ImageOffsets(const SignalLayout &layout) {
  std::vector<uint32_t> offsets;
  uint32_t offset = 0;
  for (const tSignalItem &item : layout.Items()) {
    offsets.push_back(offset);
    offset += ImageBytes(*item.signal);
  }
  return offsets;
}

}  // namespace

Status ConvertSignalsToFrames(const Session &session, uint64_t now, const double *values,
                              uint32_t valuesSize, const tRecordsOut &out) {
  const SignalLayout *layout = nullptr;
  const Status status = ConversionLayout(session, &layout);
  if (status < 0) return status;
  const uint32_t count = SignalCount(layout);
  if (valuesSize < uint64_t{count} * kBytesPerValue) return kvsimErrBufferTooSmall;
  if (count != 0 && values == nullptr) return kvsimErrNullPointer;
  return WriteFrames(session, layout, now, std::vector<double>(values, values + count), out);
}

Status ConvertImageToFrames(const Session &session, uint64_t now, const uint8_t *bytes,
                            uint32_t bytesSize, const tRecordsOut &out) {
  const SignalLayout *layout = nullptr;
  const Status status = ConversionLayout(session, &layout);
  if (status < 0) return status;
  const uint32_t imageBytes = SessionImageBytes(session);
  if (bytesSize < imageBytes) return kvsimErrBufferTooSmall;
  if (imageBytes != 0 && bytes == nullptr) return kvsimErrNullPointer;
  std::vector<double> values;
  if (layout != nullptr) {
    const std::vector<uint32_t> offsets = ImageOffsets(*layout);
    for (uint32_t i = 0; i < offsets.size(); ++i) {
      const tSignal &signal = *layout->Items()[i].signal;
      uint64_t raw = 0;
      for (uint32_t b = ImageBytes(signal); b-- > 0;) raw = (raw << 8) | bytes[offsets[i] + b];
      values.push_back(RawToPhysical(signal, raw));
    }
  }
  return WriteFrames(session, layout, now, values, out);
}

Status ConvertFramesToSignals(const Session &session, const void *records, uint32_t size,
                              double *values, uint32_t valuesSize, uint64_t *timestamps,
                              uint32_t timestampsSize) {
  const SignalLayout *layout = nullptr;
  Status status = ConversionLayout(session, &layout);
  if (status < 0) return status;
  const uint32_t count = SignalCount(layout);
  const uint64_t needed = uint64_t{count} * kBytesPerValue;
  if (valuesSize < needed) return kvsimErrBufferTooSmall;
  if (timestamps != nullptr && timestampsSize < needed) return kvsimErrBufferTooSmall;
  if (count != 0 && values == nullptr) return kvsimErrNullPointer;
  std::vector<double> found(count, 0.0);
  std::vector<uint64_t> times(count, 0);
  status = ReadFrames(session, layout, records, size, [&](uint32_t i, double value, uint64_t time) {
    found[i] = value;
    times[i] = time;
  });
  if (status < 0) return status;
  for (uint32_t i = 0; i < count; ++i) {
    values[i] = found[i];
    if (timestamps != nullptr) timestamps[i] = times[i];
  }
  return 0;
}

Status ConvertFramesToImage(const Session &session, const void *records, uint32_t size,
                            uint8_t *bytes, uint32_t bytesSize) {
  const SignalLayout *layout = nullptr;
  Status status = ConversionLayout(session, &layout);
  if (status < 0) return status;
  const uint32_t imageBytes = SessionImageBytes(session);
  if (bytesSize < imageBytes) return kvsimErrBufferTooSmall;
  if (imageBytes != 0 && bytes == nullptr) return kvsimErrNullPointer;
  std::vector<uint64_t> raws(SignalCount(layout), 0);
  status = ReadFrames(session, layout, records, size, [&](uint32_t i, double value, uint64_t) {
    raws[i] = PhysicalToRaw(*layout->Items()[i].signal, value);
  });
  if (status < 0 || layout == nullptr) return status;
  const std::vector<uint32_t> offsets = ImageOffsets(*layout);
  for (uint32_t i = 0; i < raws.size(); ++i) {
    const tSignal &signal = *layout->Items()[i].signal;
    // The signal's own bits only: a negative value's sign does not spill into the padding.
    const uint64_t raw =
        signal.numBits >= 64 ? raws[i] : raws[i] & ((uint64_t{1} << signal.numBits) - 1);
    for (uint32_t b = 0; b < ImageBytes(signal); ++b) {
      bytes[offsets[i] + b] = static_cast<uint8_t>(raw >> (8 * b));
    }
  }
  return 0;
}

}  // namespace nKvorSim
