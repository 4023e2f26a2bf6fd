// Bytes that a test has put in place of an input session's record reads: each read copies them as
// they are, whatever they hold, so that the reader's handling of any record can be tried, and a
// benchmark can see the driver's part of a read reduced to one copy.
#ifndef KVOR_SIM_FRAME_READ_STREAM_H
#define KVOR_SIM_FRAME_READ_STREAM_H

#include <cstdint>
#include <mutex>
#include <optional>
#include <vector>

namespace nKvorSim {

class FrameReadStream {
 public:
  // `repeat`: every read gets the bytes; otherwise the next read only.
  void Set(const uint8_t *bytes, uint32_t size, bool repeat);

  // Nothing if no bytes are in place; otherwise the number copied to `buffer`: as many as fit
  // into `size` and, when `maxFrames` is given, no more than the first `maxFrames` records of the
  // variable form take.
  std::optional<uint32_t> Serve(uint8_t *buffer, uint32_t size,
                                std::optional<uint32_t> maxFrames);

 private:
  std::mutex mutex_;
  std::optional<std::vector<uint8_t>> bytes_;
  bool repeat_ = false;
  uint32_t records_ = 0;  // in the bytes, walked as the variable form
};

}  // namespace nKvorSim

#endif
