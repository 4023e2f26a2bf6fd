#include "driver.h"

#include "kvsim.h"

namespace nKvorSim {

Driver &Driver::Instance() {
  // Never destroyed: static objects of the loading process may still call the driver while the
  // process exits, as a real driver allows.
  static Driver *const driver = new Driver;
  return *driver;
}

Status Driver::UseSession(uint32_t handle, std::shared_ptr<Session> *session) {
  *session = sessions_.Find(handle);
  if (!*session) return kvsimErrInvalidSession;
  return (*session)->ErrorStatus();
}

Status Driver::ErrorSessionStatus(uint32_t handle) const {
  const std::shared_ptr<Session> session = sessions_.Find(handle);
  return session ? session->ErrorStatus() : 0;
}

Status Driver::ClearSession(uint32_t handle) {
  std::shared_ptr<Session> session = sessions_.Remove(handle);
  if (!session) return kvsimErrInvalidSession;
  // Marked before the session stops, so that a start racing with the clear cannot outlive it.
  session->Events().MarkCleared();
  running_.Forget(handle);
  holds_.Wake();
  return 0;
}

void Driver::Reset() {
  for (const std::shared_ptr<Session> &session : sessions_.RemoveAll()) {
    session->Events().MarkCleared();
  }
  systems_.CloseAll();
  running_.Reset();
  blinking_.Reset();
  databases_.Reset();
  failures_.Clear();
  for (Network &network : networks_) network.Clear();
  bus_.Reset();
  clock_.Set(0);
  log_.Clear();
  log_.SetEnabled(true);
  // Last, so that a parked call that goes on does its work in the fresh driver.
  holds_.ReleaseAll();
}

}  // namespace nKvorSim
