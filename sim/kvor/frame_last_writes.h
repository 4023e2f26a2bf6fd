// What the latest successful writes of an output session handed to the driver, kept for tests that
// check the bytes a writer produced.
#ifndef KVOR_SIM_FRAME_LAST_WRITES_H
#define KVOR_SIM_FRAME_LAST_WRITES_H

#include <atomic>
#include <cstdint>
#include <mutex>
#include <optional>
#include <vector>

namespace nKvorSim {

class FrameLastWrites {
 public:
  void KeepRecords(const uint8_t *bytes, uint32_t size);
  // A sink keeps the bytes of each record write and does nothing else with them: no check, no
  // delivery. It is what a benchmark of the writer needs of the driver.
  void SetSink(bool on) { sink_.store(on); }
  bool Sink() const { return sink_.load(); }
  void KeepEthernet(std::vector<std::vector<uint8_t>> frames);

  // Copies up to `size` bytes of the last record write to `buffer`; returns how many it had.
  uint32_t CopyRecords(uint8_t *buffer, uint32_t size) const;
  uint32_t EthernetCount() const;
  // Copies up to `size` bytes of frame `index` of the last Ethernet write; returns its length, or
  // nothing if it had no such frame.
  std::optional<uint32_t> CopyEthernet(uint32_t index, uint8_t *buffer, uint32_t size) const;

 private:
  mutable std::mutex mutex_;
  std::atomic<bool> sink_{false};
  std::vector<uint8_t> records_;
  std::vector<std::vector<uint8_t>> ethernet_;
};

}  // namespace nKvorSim

#endif
