#include "driver_call.h"

#include <memory>

#include "driver.h"

namespace nKvorSim {

DriverCall::DriverCall(CallArgs args, uint32_t session)
    : args_(std::move(args)),
      session_(session),
      sequence_(Driver::Instance().Log().Append(args_)) {}

Status DriverCall::Begin() {
  Driver &driver = Driver::Instance();
  const std::shared_ptr<Session> session =
      session_ != 0 ? driver.Sessions().Find(session_) : nullptr;
  const bool goOn = driver.Holds().ParkWhileHeld(
      args_.function, [&] { return session && session->Events().IsCleared(); });
  if (!goOn) return kvsimErrSessionCleared;
  if (std::optional<Status> injected = driver.Failures().Take(args_.function, args_.propertyId)) {
    if (*injected < 0) return *injected;
    warning_ = injected;
  }
  return 0;
}

Status DriverCall::End(Status result) {
  if (result == 0 && warning_) result = *warning_;
  Driver::Instance().Log().Complete(sequence_, args_.object, result);
  return result;
}

}  // namespace nKvorSim
