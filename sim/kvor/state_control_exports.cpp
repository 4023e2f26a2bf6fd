// The state controls of kvsim.h. Like every control they are not driver calls, and they report
// misuse with -1.
#include <algorithm>
#include <memory>

#include "driver.h"
#include "kvsim.h"
#include "session_states.h"

using namespace nKvorSim;

namespace {

// The open, non-error session of `handle`, or null.
std::shared_ptr<Session> StateSession(uint32_t handle) {
  std::shared_ptr<Session> session = Driver::Instance().Sessions().Find(handle);
  if (!session || session->ErrorStatus() != 0) return nullptr;
  return session;
}

}  // namespace

extern "C" {

int32_t kvsimSetState(uint32_t session, uint32_t stateId, uint32_t size, const void *bytes,
                      uint32_t fault) {
  const std::shared_ptr<Session> target = StateSession(session);
  if (!target || bytes == nullptr) return -1;
  if (CheckStateRead(target->Definition().protocol, stateId, size) != 0) return -1;
  const auto *first = static_cast<const uint8_t *>(bytes);
  target->States().Set(stateId, StateValue{{first, first + size}, fault});
  return 0;
}

int32_t kvsimSetTimeTrigger(uint32_t session, uint64_t firesAt, const void *record) {
  const std::shared_ptr<Session> target = StateSession(session);
  if (!target || record == nullptr) return -1;
  TimeTrigger trigger;
  trigger.firesAt = firesAt;
  const auto *first = static_cast<const uint8_t *>(record);
  std::copy(first, first + kTimeRecordSize, trigger.record.begin());
  target->States().SetTrigger(trigger);
  // A trigger set in the clock's past fires for the reads that already wait.
  target->Events().Notify();
  return 0;
}

}  // extern "C"
