// The control API of kvsim.h. Controls are not driver calls: they are not logged, held or made to
// fail, and they report misuse with -1 rather than a driver status.
#include <algorithm>
#include <chrono>
#include <climits>
#include <memory>
#include <optional>

#include "driver.h"
#include "driver_functions.h"
#include "inventory.h"
#include "kvsim.h"
#include "kvsvplatform.h"
#include "session_events.h"

using namespace nKvorSim;

namespace {

// Long enough for any honest wait on a loaded machine, short enough to end a broken test.
constexpr std::chrono::milliseconds kSafetyLimit{10000};

int32_t CountToInt(size_t count) {
  return static_cast<int32_t>(std::min<size_t>(count, INT32_MAX));
}

// The open, non-error session of `handle`, or null.
std::shared_ptr<Session> ControlledSession(uint32_t handle) {
  std::shared_ptr<Session> session = Driver::Instance().Sessions().Find(handle);
  if (!session || session->ErrorStatus() != 0) return nullptr;
  return session;
}

// The inventory index of the interface of that name, if there is one.
std::optional<uint32_t> NamedInterface(const char *interfaceName) {
  if (interfaceName == nullptr) return std::nullopt;
  const std::optional<InterfacePlace> place = FindInterface(interfaceName);
  if (!place) return std::nullopt;
  return place->index;
}

int32_t AddFailure(const char *function, std::optional<uint32_t> propertyId, int32_t status,
                   int32_t count) {
  if (function == nullptr || count == 0) return -1;
  const DriverFunction *known = FindDriverFunction(function);
  if (known == nullptr || !known->returnsStatus) return -1;
  if (propertyId && !known->takesProperty) return -1;
  Driver::Instance().Failures().Add(function, propertyId, status, count);
  return 0;
}

// Reads that wait for the clock to reach a time look again at each move of it.
void WakeClockWaits() {
  for (const std::shared_ptr<Session> &session : Driver::Instance().Sessions().All()) {
    session->Events().Notify();
  }
}

}  // namespace

extern "C" {

void kvsimReset(void) { Driver::Instance().Reset(); }

int32_t kvsimFailCall(const char *function, int32_t status, int32_t count) {
  return AddFailure(function, std::nullopt, status, count);
}

int32_t kvsimFailProperty(const char *function, uint32_t propertyId, int32_t status,
                          int32_t count) {
  return AddFailure(function, propertyId, status, count);
}

void kvsimClearFailures(void) { Driver::Instance().Failures().Clear(); }

int32_t kvsimLogCount(void) { return CountToInt(Driver::Instance().Log().Count()); }

int32_t kvsimLogEntry(int32_t index, kvsimCallRecord *entry) {
  if (index < 0 || entry == nullptr) return 0;
  const std::optional<kvsimCallRecord> record =
      Driver::Instance().Log().Entry(static_cast<size_t>(index));
  if (!record) return 0;
  *entry = *record;
  return 1;
}

void kvsimLogClear(void) { Driver::Instance().Log().Clear(); }

int32_t kvsimCountCalls(const char *function) {
  if (function == nullptr) return 0;
  return CountToInt(Driver::Instance().Log().CountCalls(function));
}

int32_t kvsimCountPropertyReads(uint32_t propertyId) {
  return CountToInt(Driver::Instance().Log().CountPropertyReads(propertyId));
}

void kvsimSetClock(uint64_t rawTime) {
  Driver::Instance().Clock().Set(rawTime);
  WakeClockWaits();
}

void kvsimAdvanceClock(uint64_t delta) {
  Driver::Instance().Clock().Advance(delta);
  WakeClockWaits();
}

uint64_t kvsimClock(void) { return Driver::Instance().Clock().Now(); }

int32_t kvsimHold(const char *function) {
  if (function == nullptr || FindDriverFunction(function) == nullptr) return -1;
  Driver::Instance().Holds().Hold(function);
  return 0;
}

int32_t kvsimRelease(const char *function) {
  if (function == nullptr || FindDriverFunction(function) == nullptr) return -1;
  Driver::Instance().Holds().Release(function);
  return 0;
}

int32_t kvsimWaitParked(const char *function, int32_t count) {
  if (function == nullptr || FindDriverFunction(function) == nullptr) return 0;
  return Driver::Instance().Holds().WaitParked(function, count, kSafetyLimit) ? 1 : 0;
}

int32_t kvsimWaitBlocked(const char *function, int32_t count) {
  if (function == nullptr || FindDriverFunction(function) == nullptr) return 0;
  return Driver::Instance().Blocked().WaitFor(function, count, kSafetyLimit) ? 1 : 0;
}

int32_t kvsimSetSignalValues(uint32_t session, const double *values, int32_t count) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || (count > 0 && values == nullptr)) return -1;
  const SessionDefinition &definition = target->Definition();
  const size_t taken = std::min(definition.items.size(), static_cast<size_t>(std::max(count, 0)));
  definition.network->Publish(definition.items, values, taken, Driver::Instance().Clock().Now());
  return static_cast<int32_t>(taken);
}

int32_t kvsimGetSignalValues(uint32_t session, double *values, int32_t max) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || (max > 0 && values == nullptr)) return -1;
  const SessionDefinition &definition = target->Definition();
  const size_t copied = std::min(definition.items.size(), static_cast<size_t>(std::max(max, 0)));
  definition.network->Sample(definition.items, copied, values, nullptr);
  return CountToInt(definition.items.size());
}

int32_t kvsimRaiseCondition(uint32_t session, uint32_t condition, uint32_t value) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || !IsWaitCondition(condition)) return -1;
  target->Events().Raise(condition, value);
  return 0;
}

int32_t kvsimLowerCondition(uint32_t session, uint32_t condition) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || !IsWaitCondition(condition)) return -1;
  target->Events().Lower(condition);
  return 0;
}

int32_t kvsimSessionStarted(uint32_t session) {
  if (!ControlledSession(session)) return -1;
  return Driver::Instance().Running().SessionStarted(session) ? 1 : 0;
}

int32_t kvsimInterfaceStarted(const char *interfaceName) {
  const std::optional<uint32_t> index = NamedInterface(interfaceName);
  if (!index) return -1;
  return Driver::Instance().Running().InterfaceStarted(*index) ? 1 : 0;
}

int32_t kvsimTerminalsConnected(uint32_t session, const char *source, const char *destination) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || source == nullptr || destination == nullptr) return -1;
  return target->Terminals().IsConnected(source, destination) ? 1 : 0;
}

int32_t kvsimTerminalConnectionCount(uint32_t session) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target) return -1;
  return CountToInt(target->Terminals().Count());
}

int32_t kvsimBlinkMode(const char *interfaceName) {
  const std::optional<uint32_t> index = NamedInterface(interfaceName);
  if (!index) return -1;
  return static_cast<int32_t>(Driver::Instance().Blinking().Get(*index));
}

int32_t kvsimLinSchedule(uint32_t session, uint32_t *index) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || index == nullptr) return -1;
  const std::optional<uint32_t> selected = target->LinSchedule();
  if (!selected) return 0;
  *index = *selected;
  return 1;
}

int32_t kvsimAllowStateWrite(uint32_t session, uint32_t stateId) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || stateId == kvState_LINScheduleChange) return -1;
  target->StatesWritten().Allow(stateId);
  return 0;
}

int32_t kvsimLastState(uint32_t session, uint32_t stateId, uint32_t *value) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || value == nullptr || !target->StatesWritten().Allows(stateId)) return -1;
  const std::optional<uint32_t> last = target->StatesWritten().Last(stateId);
  if (!last) return 0;
  *value = *last;
  return 1;
}

int32_t kvsimFutureTrigger(uint32_t session, uint64_t *when, uint32_t *option) {
  const std::shared_ptr<Session> target = ControlledSession(session);
  if (!target || when == nullptr || option == nullptr) return -1;
  const std::optional<ArmedTrigger> armed = target->Trigger().Armed();
  if (!armed) return 0;
  *when = armed->when;
  *option = armed->option;
  return 1;
}

int32_t kvsimOpenSessionCount(void) { return CountToInt(Driver::Instance().Sessions().Count()); }

int32_t kvsimOpenSystemCount(void) { return CountToInt(Driver::Instance().Systems().OpenCount()); }

}  // extern "C"
