// The process's trace object: idle, since nothing in this library traces.
#ifndef KVSVAPI_DIAGNOSTICS_TRACE_H
#define KVSVAPI_DIAGNOSTICS_TRACE_H

#include <cstdint>
#include <mutex>

#include <boost/noncopyable.hpp>

#include "diagnostics/trace_destination.h"

namespace nKVSVAPI100 {

class tTrace : boost::noncopyable {
 public:
  explicit tTrace(iTraceDestination *destination) : destination_(destination) {}

  iTraceDestination *Destination() const { return destination_; }
  std::mutex &Lock() { return lock_; }

  // Two groups of three switches, further flags and a level; nothing in this library reads them.
  uint8_t firstGroup[3] = {1, 1, 0};
  uint8_t secondGroup[3] = {1, 1, 0};
  uint8_t furtherFlags[2] = {0, 0};
  uint32_t level = 50;

 private:
  iTraceDestination *destination_;
  std::mutex lock_;
};

// The static instances, built at load with the console as destination.
tTrace &ProcessTrace();
iTraceDestination &ConsoleTraceDestination();

}  // namespace nKVSVAPI100

#endif
