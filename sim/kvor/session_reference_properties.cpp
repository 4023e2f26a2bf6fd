#include "session_reference_properties.h"

#include <cstring>

#include "database_object.h"
#include "driver.h"
#include "inventory.h"
#include "kvorproperties.h"
#include "kvsim.h"

namespace nKvorSim {

namespace {

constexpr uint32_t kDatabaseHandleBit = 0x80000000u;
constexpr uint32_t kRecordBytes = 28;
constexpr uint32_t kFilterFlags = 0x7;  // the 16-bit value, the 8-bit value, the name
constexpr size_t kNameOffset = 7;
constexpr size_t kNameBytes = 21;

// 0 if `handle` is an object of `objectClass` in a loaded database; an error object answers its
// own status.
Status CheckDatabaseObject(uint32_t handle, uint32_t objectClass) {
  DatabaseRegistry &databases = Driver::Instance().Databases();
  const Status failed = databases.ErrorObjectStatus(handle);
  if (failed < 0) return failed;
  uint32_t database = 0;
  if ((handle & kDatabaseHandleBit) == 0 || databases.DatabaseOf(handle, &database) < 0)
    return kvsimErrInvalidDatabase;
  return ((handle >> 8) & 0xF0000u) == objectClass ? 0 : kvsimErrInvalidClass;
}

Status CheckHandles(uint32_t size, const void *value, uint32_t objectClass) {
  if (size % sizeof(uint32_t) != 0) return kvsimErrPropertySize;
  for (uint32_t at = 0; at < size; at += sizeof(uint32_t)) {
    uint32_t handle = 0;
    std::memcpy(&handle, static_cast<const char *>(value) + at, sizeof handle);
    const Status status = CheckDatabaseObject(handle, objectClass);
    if (status < 0) return status;
  }
  return 0;
}

// Whole records, no flag beyond the three, and every name ending within its field.
Status CheckReceiveFilter(const Session &session, uint32_t size, const void *value) {
  if (session.Definition().protocol != kProtocolEthernet) return kvsimErrWrongProtocol;
  if (size % kRecordBytes != 0) return kvsimErrPropertySize;
  for (uint32_t at = 0; at < size; at += kRecordBytes) {
    const char *record = static_cast<const char *>(value) + at;
    uint32_t flags = 0;
    std::memcpy(&flags, record, sizeof flags);
    if ((flags & ~kFilterFlags) != 0) return kvsimErrInvalidArgument;
    if (std::memchr(record + kNameOffset, '\0', kNameBytes) == nullptr)
      return kvsimErrInvalidArgument;
  }
  return 0;
}

}  // namespace

std::optional<PropertyValue> ReferenceDefaultProperty(const Session &session, uint32_t id) {
  if (id == kvPropSession_IntfEnetEptReceiveFilter &&
      session.Definition().protocol == kProtocolEthernet)
    return PropertyValue();
  return std::nullopt;
}

Status CheckReferenceProperty(const Session &session, uint32_t id, uint32_t size,
                              const void *value) {
  if (size != 0 && value == nullptr) return kvsimErrNullPointer;
  switch (id) {
    case kvPropSession_J1939ECU:
      if (size != sizeof(uint32_t)) return kvsimErrPropertySize;
      return CheckHandles(size, value, kClassEcu);
    case kvPropSession_IntfOutStrmList:
      return CheckHandles(size, value, kClassFrame);
    case kvPropSession_IntfEnetEptReceiveFilter:
      return CheckReceiveFilter(session, size, value);
    default:
      return 0;
  }
}

}  // namespace nKvorSim
