// Sessions as a host program makes them: manual creation through the library, then the handle
// behind the reference from the host's reference manager.
#ifndef KVSVAPI_TESTS_SESSION_HELPERS_H
#define KVSVAPI_TESTS_SESSION_HELPERS_H

#include <gtest/gtest.h>

#include <cstdio>
#include <string>

#include "kvsim.h"
#include "kvsvapi.h"
#include "svsim.h"

namespace kvsvtest {

struct tManualSession {
  kvsvStatus status = 0;
  kvsvRefnum reference = 0;
  uint32_t handle = 0;
};

// Reference name of a manual session.
inline std::string ManualSessionName(uint32_t handle) {
  char text[32];
  std::snprintf(text, sizeof text, "___kvorSesn#%08lx", static_cast<unsigned long>(handle));
  return text;
}

// Creates a session and finds its handle through the host reference the library registered.
inline tManualSession CreateManual(const char *list, uint32_t mode, const char *interfaceName) {
  tManualSession made;
  made.status = kvsvSessionManualCreate(":memory:", "", list, interfaceName, mode, &made.reference);
  // Other threads may register and remove references meanwhile, which shifts the positions of
  // the list: scan again until the reference, which stays until this thread removes it, is seen.
  for (int pass = 0; pass < 1000 && made.reference != 0; ++pass) {
    for (int32_t i = 0; i < svsimRefCount(); ++i) {
      SvsimRefInfo info{};
      if (svsimGetRef(i, &info) == 1 && info.cookie == made.reference) {
        made.handle = info.handle;
        return made;
      }
    }
  }
  return made;
}

// Whether the library has a slot for `handle`: a read on a missing slot fails before the driver.
inline bool HasSlot(uint32_t handle) {
  SvHandle values = nullptr;
  const kvsvStatus status = kvsvReadSignalSinglePoint(handle, &values);
  if (values != nullptr) svDisposeHandle(values);
  return status != kvErrInvalidSession;
}

}  // namespace kvsvtest

#endif
