// The frame controls of kvsim.h. Like every control they are not driver calls, and they report
// misuse with -1.
#include <algorithm>
#include <memory>
#include <optional>
#include <vector>

#include "driver.h"
#include "frame_bus.h"
#include "frame_encoding.h"
#include "frame_properties.h"
#include "kvsim.h"

using namespace nKvorSim;

namespace {

// The open, non-error session of `handle` whose mode passes `fits`, or null.
template <class Fits>
std::shared_ptr<Session> FrameSession(uint32_t handle, Fits fits) {
  std::shared_ptr<Session> session = Driver::Instance().Sessions().Find(handle);
  if (!session || session->ErrorStatus() != 0 || !fits(session->Definition().mode)) return nullptr;
  return session;
}

// The longest payload that a record can carry.
constexpr uint32_t kAnyPayload = 0x7FF;

int32_t ToInt(uint64_t count) { return static_cast<int32_t>(std::min<uint64_t>(count, INT32_MAX)); }

}  // namespace

extern "C" {

int32_t kvsimQueueFrames(uint32_t session, const void *records, uint32_t size) {
  const std::shared_ptr<Session> target = FrameSession(session, IsFrameInputMode);
  if (!target || (records == nullptr && size != 0)) return -1;
  std::vector<Frame> frames;
  if (DecodeRecords(static_cast<const uint8_t *>(records), size, RecordForm::kVariable,
                    kAnyPayload, &frames) != 0) {
    return -1;
  }
  for (const Frame &frame : frames) ReceiveFrame(*target, frame);
  target->Events().Notify();
  return ToInt(frames.size());
}

int32_t kvsimSetReadStream(uint32_t session, const void *bytes, uint32_t size, int32_t repeat) {
  const std::shared_ptr<Session> target = FrameSession(session, IsFrameInputMode);
  if (!target || (bytes == nullptr && size != 0)) return -1;
  target->ReadStream().Set(static_cast<const uint8_t *>(bytes), size, repeat != 0);
  return 0;
}

int32_t kvsimLastWrite(uint32_t session, void *buffer, uint32_t size) {
  const std::shared_ptr<Session> target = FrameSession(session, IsFrameOutputMode);
  if (!target || (buffer == nullptr && size != 0)) return -1;
  return ToInt(target->LastWrites().CopyRecords(static_cast<uint8_t *>(buffer), size));
}

int32_t kvsimLastEthernetWriteCount(uint32_t session) {
  const std::shared_ptr<Session> target = FrameSession(session, IsFrameOutputMode);
  if (!target) return -1;
  return ToInt(target->LastWrites().EthernetCount());
}

int32_t kvsimLastEthernetWrite(uint32_t session, uint32_t index, void *buffer, uint32_t size) {
  const std::shared_ptr<Session> target = FrameSession(session, IsFrameOutputMode);
  if (!target || (buffer == nullptr && size != 0)) return -1;
  const std::optional<uint32_t> length =
      target->LastWrites().CopyEthernet(index, static_cast<uint8_t *>(buffer), size);
  return length ? ToInt(*length) : -1;
}

int32_t kvsimSetWriteSink(uint32_t session, int32_t on) {
  const std::shared_ptr<Session> target = FrameSession(session, IsFrameOutputMode);
  if (!target) return -1;
  target->LastWrites().SetSink(on != 0);
  return 0;
}

int32_t kvsimDroppedFrames(uint32_t session) {
  const std::shared_ptr<Session> target = FrameSession(session, IsFrameInputMode);
  if (!target) return -1;
  return ToInt(target->Frames().Dropped());
}

void kvsimSetCallLog(int32_t on) { Driver::Instance().Log().SetEnabled(on != 0); }

}  // extern "C"
