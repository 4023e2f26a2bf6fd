#include "database/find_by_reference_string.h"

#include <cstddef>
#include <new>
#include <string>

#include "session/object_class.h"

namespace nKVSVAPI100 {

namespace {

bool IsSeparator(char c) { return c == ' ' || c == '\n'; }

// The dot count at which an object's name is refused: a frame, ECU, LIN schedule or PDU name
// holds no dot, a signal, subframe or schedule entry name ("frame.signal") one. 0: no limit.
uint32_t DotLimit(uint32_t objectClass) {
  switch (objectClass) {
    case kClassFrame:
    case kClassEcu:
    case kClassLinSchedule:
    case kClassPdu:
      return 1;
    case kClassSignal:
    case kClassSubframe:
    case kClassLinScheduleEntry:
      return 2;
    default:
      return 0;
  }
}

// The parts of a reference text, each a NUL-terminated copy.
struct tReferenceParts {
  std::string object;
  std::string database;
  std::string cluster;
};

// Cuts `text` into its parts; 0, or the status of a malformed text.
Status SplitReference(const char *text, std::size_t length, uint32_t objectClass,
                      tReferenceParts &parts) {
  std::size_t at = 0;
  if (objectClass != kClassCluster) {
    const uint32_t limit = DotLimit(objectClass);
    uint32_t dots = 0;
    Status remembered = 0;
    while (at < length && !IsSeparator(text[at])) {
      if (text[at] == '.' && ++dots == limit) remembered = kvErrDbReferenceTooDeep;
      ++at;
    }
    if (at == length) return remembered != 0 ? remembered : kvErrDbReferenceSyntax;
    parts.object.assign(text, at);
    while (at < length && IsSeparator(text[at])) ++at;
    if (remembered != 0) return remembered;
    if (at == length) return kvErrDbReferenceSyntax;
  }
  const std::string rest(text + at, length - at);
  const std::size_t dot = rest.rfind('.');
  if (dot == std::string::npos || dot + 1 == rest.size()) {
    parts.database = rest;
  } else {
    parts.database = rest.substr(0, dot);
    parts.cluster = rest.substr(dot + 1);
  }
  return 0;
}

const SvStr *CountedText(SvHandle text) {
  if (text == nullptr || *text == nullptr) return nullptr;
  const auto *counted = static_cast<const SvStr *>(*text);
  return counted->cnt > 0 ? counted : nullptr;
}

}  // namespace

Status FindDbObjectByReferenceString(SvHandle text, uint32_t objectClass, uint32_t *databaseOut,
                                     uint32_t *objectOut) {
  *databaseOut = 0;
  *objectOut = 0;
  const SvStr *counted = CountedText(text);
  if (counted == nullptr) return kvErrDbReferenceEmpty;
  tReferenceParts parts;
  try {
    const Status status =
        SplitReference(reinterpret_cast<const char *>(counted->str),
                       static_cast<std::size_t>(counted->cnt), objectClass, parts);
    if (status != 0) return status;
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }

  uint32_t database = 0;
  Status status = kvdbOpenDatabase(parts.database.c_str(), &database);
  if (status < 0) return status;
  *databaseOut = database;
  if (objectClass == kClassCluster) {
    status = kvdbFindObject(database, kClassCluster, parts.cluster.c_str(), objectOut);
  } else {
    uint32_t cluster = 0;
    status = kvdbFindObject(database, kClassCluster, parts.cluster.c_str(), &cluster);
    if (status >= 0) status = kvdbFindObject(cluster, objectClass, parts.object.c_str(), objectOut);
  }
  // The caller keeps the handle of the database it no longer holds, as the driver gave it.
  if (status < 0) kvdbCloseDatabase(database, 0);
  return status;
}

Status OpenDbObjectByText(SvHandle text, uint32_t objectClass, uint32_t *handleOut,
                          uint32_t *databaseOut) {
  *handleOut = 0;
  *databaseOut = 0;
  if (objectClass != kClassDatabase)
    return FindDbObjectByReferenceString(text, objectClass, databaseOut, handleOut);
  const SvStr *counted = CountedText(text);
  if (counted == nullptr) return kvErrDbReferenceEmpty;
  Status status;
  try {
    const std::string name(reinterpret_cast<const char *>(counted->str),
                           static_cast<std::size_t>(counted->cnt));
    status = kvdbOpenDatabase(name.c_str(), handleOut);
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }
  if (status < 0) *handleOut = 0;
  *databaseOut = *handleOut;
  return status;
}

}  // namespace nKVSVAPI100
