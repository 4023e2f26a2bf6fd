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
    {kvsimErrWrongProtocol, "The function is not available for the session's protocol."},
    {kvsimErrInvalidScope, "The scope of the start or stop is not valid."},
    {kvsimErrPropertyUnknown, "The object has no such property, or the property has no value."},
    {kvsimErrPropertyReadOnly, "The property cannot be set."},
    {kvsimErrPropertySize, "The value size does not match the property's type."},
    {kvsimErrBufferTooSmall, "The buffer is too small for the data."},
    {kvsimErrInvalidSubIndex, "The index does not name an item of the session's list."},
    {kvsimErrTimeout, "The time limit elapsed before the operation completed."},
    {kvsimErrSessionCleared, "The session was cleared while the operation waited."},
    {kvsimErrInvalidCondition, "The wait condition is not valid."},
    {kvsimErrTimeInPast, "The trigger time has already passed."},
    {kvsimErrInvalidTerminal,
     "A terminal name is not valid, or the route joins a terminal to itself."},
    {kvsimErrNotConnected, "The session has not connected these terminals."},
    {kvsimErrInvalidDatabase, "The database handle is invalid, or the database has been closed."},
    {kvsimErrUnknownState, "The state identifier is not valid."},
    {kvsimErrDatabaseNotFound, "No database alias, and no database file, has that name."},
    {kvsimErrDatabaseSyntax, "The database file is malformed; the driver names the line."},
    {kvsimErrObjectNotFound, "The database has no object of that class and name there."},
    {kvsimErrObjectExists, "The database already has an object of that name or identifier there."},
    {kvsimErrInvalidClass, "No object of that class can stand under that parent."},
    {kvsimErrInvalidName, "The name is not a valid database object name."},
    {kvsimErrDatabaseWrite, "The database cannot be saved at that place."},
    {kvsimErrSignalLayout, "A signal does not fit its frame, or overlaps another signal."},
    {kvsimErrWrongObject,
     "The reference names no object of the property's class in the object's cluster."},
    {kvsimErrInvalidFrame,
     "The frame buffer holds a malformed record, or a payload longer than the session allows."},

    // The driver keeps the texts of the language binding's statuses as well.
    {static_cast<Status>(0xBFF63001), "Internal error in the language binding; see its error log."},
    {static_cast<Status>(0xBFF63010), "The language binding ran out of memory."},
    {static_cast<Status>(0xBFF63015), "A required argument is null."},
    {static_cast<Status>(0xBFF63020), "The session reference is invalid."},
    {static_cast<Status>(0xBFF63027), "The session is in use by another call, or it is closing."},
    {static_cast<Status>(0xBFF63080), "The FlexRay time is not known yet."},
    {static_cast<Status>(0xBFF6308A), "No device or interface of that name is in the system."},
    {static_cast<Status>(0xBFF6308E), "The list of databases changed while it was read."},
    {static_cast<Status>(0xBFF63090), "The number of frames is smaller than the session's list."},
    {static_cast<Status>(0xBFF63092), "The session definition file cannot be read, or lacks the session."},
    {static_cast<Status>(0xBFF63093), "The session is already open."},
    {static_cast<Status>(0xBFF6309C), "A manually created session cannot be opened by name."},
    {static_cast<Status>(0xBFF6309F), "A frame payload was truncated to fit its target."},
    {static_cast<Status>(0xBFF630A0), "Reading all available data needs a time limit of 0."},
    {static_cast<Status>(0xBFF630A5), "The device name is empty."},
    {static_cast<Status>(0xBFF630AF), "The session's maximum payload is too large for the frame form."},
    {static_cast<Status>(0xBFF630B0), "The output array could not be allocated."},
    {static_cast<Status>(0xBFF630C0), "A name is too long for its field."},
    {static_cast<Status>(0xBFF630C1), "The FlexRay time is not valid."},
    {static_cast<Status>(0xBFF63131), "The database object is not open."},
    {static_cast<Status>(0xBFF6315E), "The database is already open in another mode."},
    {static_cast<Status>(0xBFF63160), "The number of elements does not match the session's list."},
    {static_cast<Status>(0xBFF63161), "The interface is open with another configuration."},
    {static_cast<Status>(0xBFF63162), "The session is not defined for this interface."},
    {static_cast<Status>(0xBFF63163), "The database object reference is empty."},
    {static_cast<Status>(0xBFF63164), "The database object reference is malformed."},
    {static_cast<Status>(0xBFF63166), "The session name is empty."},
    {static_cast<Status>(0xBFF63173), "The database object reference has too many levels."},
    {static_cast<Status>(0xBFF6317D), "The schedule number is not valid."},
    {static_cast<Status>(0xBFF6317E), "No schedule of that name."},
    {static_cast<Status>(0xBFF6317F), "The sub-identifier number is not valid."},
    {static_cast<Status>(0xBFF63180), "No item of that name in the session's list."},
    {static_cast<Status>(0xBFF63253), "An Ethernet frame cannot be sent as given."},
    {static_cast<Status>(0xBFF63258), "The buffer is too small for the text."},
    {static_cast<Status>(0xBFF63259), "The buffer is null."},
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
