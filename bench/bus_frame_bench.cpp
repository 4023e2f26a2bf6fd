// Frames end to end over the driver stand-in's virtual bus: written on CAN1, read on CAN2, in
// batches of 1 to 1000 frames per call, classic CAN and CAN FD of 64 bytes. Each figure stands
// beside its floor, the same frames moved by the driver's own calls on sessions the library never
// sees, measured in the same run for the same number of calls.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <cstring>
#include <vector>

#include "end_to_end_support.h"
#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace {

using namespace kvsvbench;

constexpr uint32_t kClusterSize = 32;
constexpr uint32_t kPayloadOffset = 16;
constexpr uint32_t kIdentifierOffset = 24;

struct tForm {
  bool fd;
  uint32_t length;
  uint32_t recordSize;  // of one frame in the session's form
};
constexpr tForm kClassic{false, 8, 24};
constexpr tForm kFd64{true, 64, 80};

void SetForm(uint32_t session, const tForm &form) {
  if (!form.fd) return;
  const uint32_t on = 1, limit = form.length;
  kvSetProperty(session, kvPropSession_IntfCanIoMode, sizeof on, &on);
  kvSetProperty(session, kvPropSession_PayldLenMax, sizeof limit, &limit);
}

uint8_t PayloadByte(int frame, uint32_t b) { return static_cast<uint8_t>(frame * 3 + b); }

// The host clusters a program writes: identifiers 0x100 + i, payloads that differ per frame.
class cWriteClusters {
 public:
  cWriteClusters(int count, uint32_t length)
      : frames_(svNewHandleClr(8 + static_cast<size_t>(count) * kClusterSize)) {
    std::memcpy(*frames_, &count, 4);
    for (int i = 0; i < count; ++i) {
      SvHandle payload = svNewHandleClr(4 + length + 3);
      const int32_t n = static_cast<int32_t>(length);
      std::memcpy(*payload, &n, 4);
      for (uint32_t b = 0; b < length; ++b)
        static_cast<uint8_t *>(*payload)[4 + b] = PayloadByte(i, b);
      uint8_t *cluster = static_cast<uint8_t *>(*frames_) + 8 + i * kClusterSize;
      std::memcpy(cluster + kPayloadOffset, &payload, sizeof payload);
      const uint32_t id = 0x100u + static_cast<uint32_t>(i % 0x700);
      std::memcpy(cluster + kIdentifierOffset, &id, 4);
      payloads_.push_back(payload);
    }
  }
  ~cWriteClusters() {
    for (SvHandle payload : payloads_) svDisposeHandle(payload);
    svDisposeHandle(frames_);
  }
  cWriteClusters(const cWriteClusters &) = delete;
  cWriteClusters &operator=(const cWriteClusters &) = delete;
  SvHandle frames() const { return frames_; }

 private:
  SvHandle frames_;
  std::vector<SvHandle> payloads_;
};

// The same frames as driver records in the session's form.
std::vector<uint8_t> Records(int count, const tForm &form) {
  std::vector<uint8_t> records(static_cast<size_t>(count) * form.recordSize);
  for (int i = 0; i < count; ++i) {
    uint8_t *record = records.data() + static_cast<size_t>(i) * form.recordSize;
    const uint32_t id = 0x100u + static_cast<uint32_t>(i % 0x700);
    std::memcpy(record + 8, &id, 4);
    record[15] = static_cast<uint8_t>(form.length);
    for (uint32_t b = 0; b < form.length; ++b) record[16 + b] = PayloadByte(i, b);
  }
  return records;
}

// Whether the read delivered every frame of the batch with its identifier and payload.
bool Delivered(SvHandle frames, int count, const tForm &form) {
  if (ArrayCountOf(frames) != count) return false;
  for (int i = 0; i < count; ++i) {
    const uint8_t *cluster = static_cast<const uint8_t *>(*frames) + 8 + i * kClusterSize;
    uint32_t id;
    SvHandle payload;
    std::memcpy(&id, cluster + kIdentifierOffset, 4);
    std::memcpy(&payload, cluster + kPayloadOffset, sizeof payload);
    const uint8_t *bytes = static_cast<const uint8_t *>(*payload);
    int32_t length;
    std::memcpy(&length, bytes, 4);
    if (id != 0x100u + static_cast<uint32_t>(i % 0x700) || length != int32_t(form.length))
      return false;
    for (uint32_t b = 0; b < form.length; ++b)
      if (bytes[4 + b] != PayloadByte(i, b)) return false;
  }
  return true;
}

// Our figure: the reader on CAN2 is the library's; the writer on CAN1 is the library's too, or,
// for the read alone, the driver's own with ready records. The floor: the driver's own write of
// ready records and read of them on CAN3 and CAN4, a network of its own, so that both pairs stay
// open and their rounds take turns.
void BusFrames(benchmark::State &state, const tForm &form, bool libraryWrites) {
  kvsimReset();
  kvsimSetCallLog(0);
  const int count = static_cast<int>(state.range(0));
  const cLibrarySession writer(":memory:", "", "CAN1", kvMode_FrameOutStream);
  const cLibrarySession reader(":memory:", "", "CAN2", kvMode_FrameInStream);
  const cDriverSession floorWriter(":memory:", "", "CAN3", kvMode_FrameOutStream);
  const cDriverSession floorReader(":memory:", "", "CAN4", kvMode_FrameInStream);
  for (uint32_t session :
       {writer.handle(), reader.handle(), floorWriter.handle(), floorReader.handle()})
    SetForm(session, form);
  const cWriteClusters clusters(count, form.length);
  const std::vector<uint8_t> records = Records(count, form);
  const auto size = static_cast<uint32_t>(records.size());
  std::vector<uint8_t> buffer(records.size());
  SvHandle frames = nullptr, spares = nullptr;
  const tTimes times = TimeBesideFloor(
      state,
      [&] {
        const kvsvStatus written =
            libraryWrites ? kvsvWriteFrameCAN(writer.handle(), clusters.frames(), 0.0)
                          : kvWriteFrame(writer.handle(), records.data(), size, 0.0);
        return written == 0 && kvsvReadFrameCAN(reader.handle(), count, &frames, &spares, 0.0) == 0 &&
               ArrayCountOf(frames) == count;
      },
      [&] { return Delivered(frames, count, form); },
      [&] {
        uint32_t got = 0;
        return kvWriteFrame(floorWriter.handle(), records.data(), size, 0.0) == 0 &&
               kvReadFrame(floorReader.handle(), buffer.data(), size, 0.0, &got) == 0 &&
               got == size;
      });
  DisposeFrameArrays(frames, spares);
  if (!times.failed) ReportBesideFloor(state, count, times);
  kvsimSetCallLog(1);
}

void BM_BusFramesCAN(benchmark::State &state) { BusFrames(state, kClassic, true); }
void BM_BusFramesCANFD64(benchmark::State &state) { BusFrames(state, kFd64, true); }
void BM_BusFrameReadCAN(benchmark::State &state) { BusFrames(state, kClassic, false); }
void BM_BusFrameReadCANFD64(benchmark::State &state) { BusFrames(state, kFd64, false); }

BENCHMARK(BM_BusFramesCAN)->Apply(Batches);
BENCHMARK(BM_BusFramesCANFD64)->Apply(Batches);
BENCHMARK(BM_BusFrameReadCAN)->Apply(Batches);
BENCHMARK(BM_BusFrameReadCANFD64)->Apply(Batches);

}  // namespace
