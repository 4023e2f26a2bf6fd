// What the latest successful writes of an output session handed to the driver, kept for tests that
// check the bytes a writer produced.
#ifndef KVOR_SIM_FRAME_LAST_WRITES_H
#define KVOR_SIM_FRAME_LAST_WRITES_H

#include <cstdint>
#include <mutex>
#include <optional>
#include <vector>

namespace nKvorSim {

class FrameLastWrites {
 public:
  void KeepRecords(const uint8_t *bytes, uint32_t size);
  void KeepEthernet(std::vector<std::vector<uint8_t>> frames);

  // Copies up to `size` bytes of the last record write to `buffer`; returns how many it had.
  uint32_t CopyRecords(uint8_t *buffer, uint32_t size) const;
  uint32_t EthernetCount() const;
  // Copies up to `size` bytes of frame `index` of the last Ethernet write; returns its length, or
  // nothing if it had no such frame.
  std::optional<uint32_t> CopyEthernet(uint32_t index, uint8_t *buffer, uint32_t size) const;

 private:
  mutable std::mutex mutex_;
  std::vector<uint8_t> records_;
  std::vector<std::vector<uint8_t>> ethernet_;
};

}  // namespace nKvorSim

#endif
