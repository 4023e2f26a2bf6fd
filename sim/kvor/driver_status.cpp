#include "driver_status.h"

#include <cstdio>

#include "kvsim.h"

namespace nKvorSim {

namespace {

struct StatusText {
  Status status;
  const char *text;
};

constexpr StatusText kTexts[] = {
    {0, "The operation completed successfully."},
    {kvsimErrInternal, "The driver failed unexpectedly."},
    {kvsimErrOutOfMemory, "The driver ran out of memory."},
    {kvsimErrNullPointer, "A required pointer argument is null."},
    {kvsimErrInvalidArgument, "An argument is out of its range."},
    {kvsimErrInvalidSession, "The session handle is invalid, or the session has been cleared."},
    {kvsimErrInvalidObject,
     "The system, device or interface handle is invalid, or its system has been closed."},
    {kvsimErrTooManySessions, "The driver cannot open more sessions."},
    {kvsimErrTooManySystems, "The driver cannot open more systems."},
    {kvsimErrUnknownInterface, "The interface name does not name an interface of the system."},
    {kvsimErrInvalidMode, "The session mode is not valid."},
    {kvsimErrInvalidList, "The session list contains an empty item."},
    {kvsimErrWrongMode, "The function is not available in the session's mode."},
    {kvsimErrPropertyUnknown, "The object has no such property, or the property has no value."},
    {kvsimErrPropertyReadOnly, "The property cannot be set."},
    {kvsimErrPropertySize, "The value size does not match the property's type."},
    {kvsimErrBufferTooSmall, "The buffer is too small for the data."},
    {kvsimErrInvalidSubIndex, "The index does not name an item of the session's list."},
    {kvsimErrTimeout, "The time limit elapsed before the operation completed."},
    {kvsimErrSessionCleared, "The session was cleared while the operation waited."},
    {kvsimErrInvalidCondition, "The wait condition is not valid."},
};

const char *KnownStatusText(Status status) {
  for (const StatusText &entry : kTexts) {
    if (entry.status == status) return entry.text;
  }
  return nullptr;
}

}  // namespace

void WriteStatusText(Status status, uint32_t size, char *text) {
  if (size == 0 || text == nullptr) return;
  if (const char *known = KnownStatusText(status)) {
    std::snprintf(text, size, "%s", known);
  } else {
    std::snprintf(text, size, "Unknown %s (status 0x%08X).", status < 0 ? "error" : "warning",
                  static_cast<unsigned>(status));
  }
}

}  // namespace nKvorSim
