#include "frame_reads.h"

#include <algorithm>
#include <cmath>
#include <vector>

#include "frame_encoding.h"
#include "frame_items.h"
#include "frame_properties.h"
#include "inventory.h"
#include "kvsim.h"
#include "kvsvplatform.h"
#include "virtual_clock.h"

namespace nKvorSim {

namespace {

Status CheckInput(const Session &session, double timeLimit, bool ethernet) {
  const SessionDefinition &definition = session.Definition();
  if (!IsFrameInputMode(definition.mode)) return kvsimErrWrongMode;
  if ((definition.protocol == kProtocolEthernet) != ethernet) return kvsimErrWrongProtocol;
  if (std::isnan(timeLimit)) return kvsimErrInvalidArgument;
  return 0;
}

// Waits, if the read has a time limit, until `full` holds; 0 also when the limit ran out.
template <class Full>
Status AwaitFrames(Session &session, const ReadWait &wait, Full full) {
  if (wait.timeLimit == 0.0 || full()) return 0;
  return session.Events().WaitUntil(full, wait.timeLimit, wait.blocked, wait.function);
}

// What a single-point session holds for list item `index`: its latest frame, or, before any has
// arrived, the item's frame at time 0 with a payload of zeros of the item's length.
Frame LatestOfItem(const Session &session, uint32_t index) {
  if (std::optional<Frame> latest = session.Frames().Latest(index)) return *latest;
  Frame never;
  if (std::optional<FrameItem> item = LookUpFrameItem(session.Definition().items[index])) {
    never.identifier = item->identifier;
  }
  never.payload.assign(ItemPayloadLength(session, index), 0);
  return never;
}

uint32_t ReadLatest(const Session &session, RecordForm form, uint8_t *buffer, uint32_t size,
                    uint32_t maxFrames) {
  const uint32_t count =
      std::min(maxFrames, static_cast<uint32_t>(session.Definition().items.size()));
  uint32_t offset = 0;
  for (uint32_t index = 0; index < count; ++index) {
    const Frame frame = LatestOfItem(session, index);
    const uint32_t bytes = EncodedSize(frame, form);
    if (bytes > size - offset) break;
    EncodeRecord(frame, form, buffer + offset);
    offset += bytes;
  }
  return offset;
}

void FillDescriptor(const Frame &frame, tEthernetReadDescriptor *descriptor) {
  const uint32_t length = static_cast<uint32_t>(frame.payload.size());
  const uint32_t room = descriptor->data != 0 ? descriptor->length : 0;
  const uint32_t stored = std::min(room, length);
  if (stored != 0) {
    std::memcpy(reinterpret_cast<void *>(static_cast<uintptr_t>(descriptor->data)),
                frame.payload.data(), stored);
  }
  descriptor->length = stored;
  descriptor->flags = (frame.flags & kEthernetEchoFlag) | (stored < length ? kEthernetCutFlag : 0);
  descriptor->wireLength = length;
  descriptor->word = frame.sequence;
  descriptor->firstTime = NsTime(frame.timestamp);
  descriptor->secondTime = NsTime(frame.sentAt);
}

}  // namespace

Status ReadRecords(Session &session, void *buffer, uint32_t size,
                   std::optional<uint32_t> maxFrames, const ReadWait &wait,
                   uint32_t *bytesReturned) {
  if (bytesReturned == nullptr || (buffer == nullptr && size != 0)) return kvsimErrNullPointer;
  const Status status = CheckInput(session, wait.timeLimit, false);
  if (status != 0) return status;
  auto *bytes = static_cast<uint8_t *>(buffer);
  if (std::optional<uint32_t> served = session.ReadStream().Serve(bytes, size, maxFrames)) {
    *bytesReturned = *served;
    return 0;
  }
  const RecordForm form = maxFrames ? RecordForm::kVariable : SessionRecordForm(session);
  const uint32_t most = maxFrames.value_or(UINT32_MAX);
  if (session.Definition().mode == kvMode_FrameInSinglePoint) {
    *bytesReturned = ReadLatest(session, form, bytes, size, most);
    return 0;
  }
  FrameInbox &inbox = session.Frames();
  const Status waited =
      AwaitFrames(session, wait, [&] { return inbox.CanFill(form, size, most); });
  if (waited != 0) return waited;
  *bytesReturned = inbox.TakeRecords(form, bytes, size, most);
  return 0;
}

Status ReadEthernetFrames(Session &session, tEthernetReadDescriptor *descriptors,
                          uint32_t numFrames, const ReadWait &wait, int32_t *numReturned) {
  if (numReturned == nullptr || (descriptors == nullptr && numFrames != 0)) {
    return kvsimErrNullPointer;
  }
  Status status = CheckInput(session, wait.timeLimit, true);
  if (status != 0) return status;
  if (session.Definition().mode == kvMode_FrameInSinglePoint) return kvsimErrWrongMode;
  FrameInbox &inbox = session.Frames();
  status = AwaitFrames(session, wait, [&] { return inbox.Pending() >= numFrames; });
  if (status != 0) return status;
  const std::vector<Frame> frames =
      inbox.TakeFrames(std::min<uint32_t>(numFrames, INT32_MAX));
  for (size_t i = 0; i < frames.size(); ++i) FillDescriptor(frames[i], &descriptors[i]);
  *numReturned = static_cast<int32_t>(frames.size());
  return 0;
}

}  // namespace nKvorSim
