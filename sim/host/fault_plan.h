// Injected allocation and resize failures, the next Nth of each kind or all of them, and injected
// failures of the next Nth lock or unlock of a waveform array.
#ifndef SVHOST_FAULT_PLAN_H
#define SVHOST_FAULT_PLAN_H

#include <cstdint>
#include <mutex>

namespace svhost {

class FaultPlan {
 public:
  static FaultPlan &Instance();

  // Each call is one attempt; true means that this attempt is to fail.
  bool AllocationFails();
  bool ResizeFails();
  bool LockFails();
  bool UnlockFails();

  void FailAllocationAt(uint32_t n);
  void FailResizeAt(uint32_t n);
  void FailAll(bool on);
  void FailLockAt(uint32_t n);
  void FailUnlockAt(uint32_t n);
  uint64_t Injected();
  void ResetCount();
  void Reset();

 private:
  // Counts down `countdown` (0: disarmed) and says whether this attempt fails.
  bool Attempt(uint32_t &countdown);

  std::mutex mutex_;
  uint32_t allocationCountdown_ = 0;
  uint32_t resizeCountdown_ = 0;
  uint32_t lockCountdown_ = 0;
  uint32_t unlockCountdown_ = 0;
  bool all_ = false;
  uint64_t injected_ = 0;
};

}  // namespace svhost

#endif
