// The recursive, priority-inheriting mutex of the global managers.
#ifndef KVSVAPI_CORE_RECURSIVE_MUTEX_H
#define KVSVAPI_CORE_RECURSIVE_MUTEX_H

#include <pthread.h>

#include <boost/noncopyable.hpp>
#include <mutex>

#include "core/status_block.h"

namespace nKVSVAPI100 {

// Locked through std::lock_guard, which this header brings along for its users.
class cRecursiveMutex : boost::noncopyable {
 public:
  // A mutex that cannot be made leaves -52003 in `owner` (this header's path, line of the
  // failure), and Valid() is false.
  explicit cRecursiveMutex(tStatusBlock &owner);
  ~cRecursiveMutex();

  bool Valid() const { return valid_; }
  void lock();
  void unlock();

 private:
  pthread_mutex_t mutex_;
  bool valid_ = false;
};

}  // namespace nKVSVAPI100

#endif
