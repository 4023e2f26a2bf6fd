#include "frame_encoding.h"

#include <algorithm>

#include "kvsim.h"

namespace nKvorSim {

namespace {

constexpr uint32_t kTimestampAt = 0;

uint32_t StoredPayload(const Frame &frame, RecordForm form) {
  const uint32_t length = static_cast<uint32_t>(frame.payload.size());
  return form == RecordForm::kFixed ? std::min(length, kFixedPayloadMax) : length;
}

}  // namespace

uint32_t EncodedSize(const Frame &frame, RecordForm form) {
  if (form == RecordForm::kFixed) return kFixedRecordSize;
  return RecordSize(static_cast<uint32_t>(frame.payload.size()));
}

void EncodeRecord(const Frame &frame, RecordForm form, uint8_t *out) {
  const uint32_t size = EncodedSize(frame, form);
  const uint32_t stored = StoredPayload(frame, form);
  std::memset(out, 0, size);
  StoreU64(out + kTimestampAt, frame.timestamp);
  StoreU32(out + kRecordIdentifierAt, frame.identifier);
  out[kRecordTypeAt] = frame.type;
  out[kRecordFlagsAt] = frame.flags;
  out[kRecordInfoAt] = frame.info;
  out[kRecordLengthAt] = static_cast<uint8_t>(stored);
  if (stored != 0) std::memcpy(out + kRecordHeader, frame.payload.data(), stored);
}

Status DecodeRecords(const uint8_t *buffer, uint32_t size, RecordForm form, uint32_t payloadLimit,
                     std::vector<Frame> *frames) {
  frames->clear();
  if (form == RecordForm::kFixed && size % kFixedRecordSize != 0) return kvsimErrInvalidFrame;
  uint32_t offset = 0;
  while (offset < size) {
    const uint32_t left = size - offset;
    if (left < kRecordHeader) break;
    const uint8_t *record = buffer + offset;
    const uint32_t length =
        form == RecordForm::kFixed ? record[kRecordLengthAt] : RecordPayloadLength(record);
    const uint32_t step = form == RecordForm::kFixed ? kFixedRecordSize : RecordSize(length);
    if (step > left || length > step - kRecordHeader || length > payloadLimit) break;
    Frame frame;
    frame.timestamp = LoadU64(record + kTimestampAt);
    frame.identifier = LoadU32(record + kRecordIdentifierAt);
    frame.type = record[kRecordTypeAt];
    frame.flags = record[kRecordFlagsAt];
    frame.info = record[kRecordInfoAt];
    frame.payload.assign(record + kRecordHeader, record + kRecordHeader + length);
    frames->push_back(std::move(frame));
    offset += step;
  }
  if (offset == size) return 0;
  frames->clear();
  return kvsimErrInvalidFrame;
}

}  // namespace nKvorSim
