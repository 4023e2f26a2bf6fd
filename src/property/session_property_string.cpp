// kvsvSessionGetPropString and kvsvSessionSetPropString with their Ex forms: a host string
// against the driver's NUL-terminated text.
#include <cstdint>
#include <cstring>
#include <iterator>

#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/session_property_call.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kStringSubIds[] = {kvPropSessionSub_J1939_AddrFilter};

char *TextOf(SvHandle string) { return static_cast<char *>(*string) + kHostCountBytes; }

// The counted length follows the text, which may be shorter than the size the driver gave.
void CountText(SvHandle string) {
  static_cast<SvStr *>(*string)->cnt = static_cast<int32_t>(std::strlen(TextOf(string)));
}

// The host sees "database.cluster", read as two properties into one handle.
Status ReadClusterName(uint32_t handle, SvHandle *value) {
  if (value == nullptr) return kvErrNullArgument;
  uint32_t databaseSize = 0;
  Status status = tSessionPropertyCalls::GetSize(handle, kvPropSession_DatabaseName, &databaseSize);
  if (status < 0) return status;
  // A failure here shows at the cluster name's read, which then has too little room.
  uint32_t clusterSize = 0;
  tSessionPropertyCalls::GetSize(handle, kvPropSession_ClusterName, &clusterSize);
  const uint32_t sum = databaseSize + clusterSize;
  status = ResizeOrCreateHandle(value, uint64_t{sum} + kStringSlack);
  if (status < 0) return status;
  char *text = TextOf(*value);
  status = tSessionPropertyCalls::Get(handle, kvPropSession_DatabaseName, sum, text);
  if (status < 0) {
    KeepStringCountInBlock(*value);
    return status;
  }
  const size_t length = std::strlen(text);
  text[length] = '.';
  status = tSessionPropertyCalls::Get(handle, kvPropSession_ClusterName,
                                      sum - static_cast<uint32_t>(length), text + length + 1);
  if (status >= 0) {
    CountText(*value);
  } else {
    KeepStringCountInBlock(*value);
  }
  return status;
}

Status ReadString(uint32_t handle, uint32_t id, SvHandle *value) {
  if (id == kvPropSession_ClusterName) return ReadClusterName(handle, value);
  // The handle has room behind the driver's bytes: a text without its NUL ends there.
  const auto countText = [value](Status status, uint32_t size) {
    if (status < 0) return KeepStringCountInBlock(*value);
    TextOf(*value)[size] = '\0';
    CountText(*value);
  };
  return ReadSizedIntoHandle<tSessionPropertyCalls>(handle, id, value, kStringSlack, countText);
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExString(uint32_t session, SvHandle *,
                                                             uint32_t id, SvHandle *value,
                                                             SvHandle *info) {
  return RunSessionPropertyCall(session, id, info,
                                [&](uint32_t handle) { return ReadString(handle, id, value); });
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropString(uint32_t session, uint32_t id,
                                                           SvHandle *value, SvHandle *info) {
  return kvsvSessionGetPropExString(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExString(uint32_t session, SvHandle *subId,
                                                             uint32_t id, SvHandle *value,
                                                             SvHandle *info) {
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) -> Status {
    const cTextSource text(value);
    if (text.status() < 0) return text.status();
    return SetSessionPropertyValue(handle, subId, id, text.source(),
                                   {kStringSubIds, std::size(kStringSubIds)});
  });
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropString(uint32_t session, uint32_t id,
                                                           SvHandle *value, SvHandle *info) {
  return kvsvSessionSetPropExString(session, nullptr, id, value, info);
}
