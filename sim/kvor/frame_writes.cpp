#include "frame_writes.h"

#include <algorithm>
#include <cmath>
#include <vector>

#include "frame_encoding.h"
#include "frame_properties.h"
#include "inventory.h"
#include "kvsim.h"

namespace nKvorSim {

namespace {

Status CheckOutput(const Session &session, double timeLimit, bool ethernet) {
  const SessionDefinition &definition = session.Definition();
  if (!IsFrameOutputMode(definition.mode)) return kvsimErrWrongMode;
  if ((definition.protocol == kProtocolEthernet) != ethernet) return kvsimErrWrongProtocol;
  if (std::isnan(timeLimit)) return kvsimErrInvalidArgument;
  return 0;
}

}  // namespace

Status WriteRecords(Driver &driver, Session &session, const void *buffer, uint32_t size,
                    double timeLimit) {
  if (buffer == nullptr && size != 0) return kvsimErrNullPointer;
  Status status = CheckOutput(session, timeLimit, false);
  if (status != 0) return status;
  if (session.LastWrites().Sink()) {
    session.LastWrites().KeepRecords(static_cast<const uint8_t *>(buffer), size);
    return 0;
  }
  const RecordForm form = SessionRecordForm(session);
  const uint32_t limit = form == RecordForm::kFixed
                             ? std::min(PayloadLimit(session), kFixedPayloadMax)
                             : PayloadLimit(session);
  const auto *bytes = static_cast<const uint8_t *>(buffer);
  std::vector<Frame> frames;
  status = DecodeRecords(bytes, size, form, limit, &frames);
  if (status != 0) return status;
  session.LastWrites().KeepRecords(bytes, size);
  driver.Bus().Transmit(session, std::move(frames), driver.Clock().Now(), driver.Sessions());
  return 0;
}

Status WriteEthernetFrames(Driver &driver, Session &session,
                           const tEthernetWriteDescriptor *descriptors, uint32_t count,
                           double timeLimit) {
  if (descriptors == nullptr && count != 0) return kvsimErrNullPointer;
  const Status status = CheckOutput(session, timeLimit, true);
  if (status != 0) return status;
  const uint32_t limit = PayloadLimit(session);
  std::vector<std::vector<uint8_t>> sent;
  sent.reserve(count);
  for (uint32_t i = 0; i < count; ++i) {
    const tEthernetWriteDescriptor &descriptor = descriptors[i];
    if (descriptor.length > limit || (descriptor.data == 0 && descriptor.length != 0)) {
      return kvsimErrInvalidFrame;
    }
    const auto *data = reinterpret_cast<const uint8_t *>(static_cast<uintptr_t>(descriptor.data));
    sent.emplace_back(data, data + descriptor.length);
  }
  std::vector<Frame> frames(count);
  for (uint32_t i = 0; i < count; ++i) frames[i].payload = sent[i];
  session.LastWrites().KeepEthernet(std::move(sent));
  driver.Bus().Transmit(session, std::move(frames), driver.Clock().Now(), driver.Sessions());
  return 0;
}

}  // namespace nKvorSim
