#include "fault_plan.h"

#include "svsim.h"

namespace svhost {

FaultPlan &FaultPlan::Instance() {
  // Never destroyed: the library may still allocate from static destructors at exit.
  static FaultPlan *plan = new FaultPlan;
  return *plan;
}

bool FaultPlan::Attempt(uint32_t &countdown) {
  bool fails = all_;
  if (countdown != 0 && --countdown == 0) fails = true;
  if (fails) ++injected_;
  return fails;
}

bool FaultPlan::AllocationFails() {
  std::lock_guard<std::mutex> lock(mutex_);
  return Attempt(allocationCountdown_);
}

bool FaultPlan::ResizeFails() {
  std::lock_guard<std::mutex> lock(mutex_);
  return Attempt(resizeCountdown_);
}

// Locks are not memory: only their own countdowns, never FailAll, make them fail.
bool FaultPlan::LockFails() {
  std::lock_guard<std::mutex> lock(mutex_);
  if (lockCountdown_ == 0 || --lockCountdown_ != 0) return false;
  ++injected_;
  return true;
}

bool FaultPlan::UnlockFails() {
  std::lock_guard<std::mutex> lock(mutex_);
  if (unlockCountdown_ == 0 || --unlockCountdown_ != 0) return false;
  ++injected_;
  return true;
}

void FaultPlan::FailAllocationAt(uint32_t n) {
  std::lock_guard<std::mutex> lock(mutex_);
  allocationCountdown_ = n;
}

void FaultPlan::FailResizeAt(uint32_t n) {
  std::lock_guard<std::mutex> lock(mutex_);
  resizeCountdown_ = n;
}

void FaultPlan::FailLockAt(uint32_t n) {
  std::lock_guard<std::mutex> lock(mutex_);
  lockCountdown_ = n;
}

void FaultPlan::FailUnlockAt(uint32_t n) {
  std::lock_guard<std::mutex> lock(mutex_);
  unlockCountdown_ = n;
}

void FaultPlan::FailAll(bool on) {
  std::lock_guard<std::mutex> lock(mutex_);
  all_ = on;
}

uint64_t FaultPlan::Injected() {
  std::lock_guard<std::mutex> lock(mutex_);
  return injected_;
}

void FaultPlan::ResetCount() {
  std::lock_guard<std::mutex> lock(mutex_);
  injected_ = 0;
}

void FaultPlan::Reset() {
  std::lock_guard<std::mutex> lock(mutex_);
  allocationCountdown_ = 0;
  resizeCountdown_ = 0;
  lockCountdown_ = 0;
  unlockCountdown_ = 0;
  all_ = false;
  injected_ = 0;
}

}  // namespace svhost

extern "C" {

void svsimFailAllocAt(uint32_t n) { svhost::FaultPlan::Instance().FailAllocationAt(n); }
void svsimFailResizeAt(uint32_t n) { svhost::FaultPlan::Instance().FailResizeAt(n); }
void svsimFailAll(int32_t on) { svhost::FaultPlan::Instance().FailAll(on != 0); }
void svsimFailWaveformLockAt(uint32_t n) { svhost::FaultPlan::Instance().FailLockAt(n); }
void svsimFailWaveformUnlockAt(uint32_t n) { svhost::FaultPlan::Instance().FailUnlockAt(n); }
uint64_t svsimInjectedFaults(void) { return svhost::FaultPlan::Instance().Injected(); }

}  // extern "C"
