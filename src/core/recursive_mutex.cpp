#include "core/recursive_mutex.h"

#include "core/status.h"

namespace nKVSVAPI100 {

namespace {

// Where a failed mutex is recorded: the error log names this module and line.
constexpr char kMutexSource[] = "src/core/recursive_mutex.h";
constexpr uint64_t kMutexFailureLine = 655;

// Recursive because a manager's operations call each other under the lock; priority-inheriting
// because host programs run threads at several priorities and a low one may hold the lock.
bool InitRecursiveInheriting(pthread_mutex_t &mutex) {
  pthread_mutexattr_t attributes;
  if (pthread_mutexattr_init(&attributes) != 0) return false;
  const bool made = pthread_mutexattr_settype(&attributes, PTHREAD_MUTEX_RECURSIVE) == 0 &&
                    pthread_mutexattr_setprotocol(&attributes, PTHREAD_PRIO_INHERIT) == 0 &&
                    pthread_mutex_init(&mutex, &attributes) == 0;
  pthread_mutexattr_destroy(&attributes);
  return made;
}

}  // namespace

cRecursiveMutex::cRecursiveMutex(tStatusBlock &owner) {
  valid_ = InitRecursiveInheriting(mutex_);
  if (!valid_) SetStatusBlock(owner, kMutexInitFailed, "kvsvapi", kMutexSource, kMutexFailureLine);
}

cRecursiveMutex::~cRecursiveMutex() {
  if (valid_) pthread_mutex_destroy(&mutex_);
}

// Callers test the owner's status block before locking; a mutex that was never made is not
// touched.
void cRecursiveMutex::lock() {
  if (valid_) pthread_mutex_lock(&mutex_);
}

void cRecursiveMutex::unlock() {
  if (valid_) pthread_mutex_unlock(&mutex_);
}

}  // namespace nKVSVAPI100
