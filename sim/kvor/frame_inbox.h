// The frames that an input session has received and not yet read: a queue of bounded length for
// stream and queued sessions, the latest frame of each list item for single-point sessions.
#ifndef KVOR_SIM_FRAME_INBOX_H
#define KVOR_SIM_FRAME_INBOX_H

#include <cstdint>
#include <deque>
#include <map>
#include <mutex>
#include <optional>
#include <vector>

#include "frame.h"
#include "frame_record.h"

namespace nKvorSim {

class FrameInbox {
 public:
  // Appends `frame`, or drops and counts it when `capacity` frames wait already.
  void Enqueue(Frame frame, uint32_t capacity);
  // Keeps `frame` as the latest of list item `index`.
  void KeepLatest(uint32_t index, Frame frame);
  // Forgets what waits and what was latest; the count of drops stays.
  void Flush();

  uint32_t Pending() const;
  uint64_t Dropped() const;
  std::optional<Frame> Latest(uint32_t index) const;

  // Whether a read of at most `maxFrames` records of `form` into `size` bytes would be whole:
  // the frames waiting fill it, or `maxFrames` of them wait.
  bool CanFill(RecordForm form, uint32_t size, uint32_t maxFrames) const;
  // Takes the waiting frames, oldest first, as long as their records fit into `size` bytes and
  // they are at most `maxFrames`, and writes the records at `buffer`. Returns the bytes written.
  uint32_t TakeRecords(RecordForm form, uint8_t *buffer, uint32_t size, uint32_t maxFrames);
  // Takes up to `maxFrames` waiting frames, oldest first.
  std::vector<Frame> TakeFrames(uint32_t maxFrames);

 private:
  // Waiting frames whose records fit into `size` bytes, at most `maxFrames`, and their bytes.
  struct Fit {
    uint32_t frames = 0;
    uint32_t bytes = 0;
    bool full = false;  // no further record would fit
  };
  Fit Measure(RecordForm form, uint32_t size, uint32_t maxFrames) const;

  mutable std::mutex mutex_;
  std::deque<Frame> queue_;
  std::map<uint32_t, Frame> latest_;  // by list index
  uint64_t dropped_ = 0;
};

}  // namespace nKvorSim

#endif
