// The host's answer to data that it did not make or that is no longer alive: stop the process
// with a message, since going on would corrupt the heap.
#ifndef SVHOST_FATAL_H
#define SVHOST_FATAL_H

namespace svhost {

// Writes "svhost: <operation>(<object>): <problem>" to standard error and aborts.
[[noreturn]] void Fatal(const char *operation, const void *object, const char *problem);

}  // namespace svhost

#endif
