#include "support/refused_mutexes.h"

#include <dlfcn.h>
#include <pthread.h>

#include <cerrno>

namespace kvsvtest {

std::atomic<bool> gRefuseMutexes{true};

}  // namespace kvsvtest

extern "C" int pthread_mutexattr_setprotocol(pthread_mutexattr_t *attributes, int protocol) {
  if (kvsvtest::gRefuseMutexes.load()) return EINVAL;
  using tSetProtocol = int (*)(pthread_mutexattr_t *, int);
  static const auto real =
      reinterpret_cast<tSetProtocol>(dlsym(RTLD_NEXT, "pthread_mutexattr_setprotocol"));
  return real(attributes, protocol);
}
