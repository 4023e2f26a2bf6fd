#include "property/session_name_to_index.h"

#include <new>

#include "kvorproperties.h"
#include "property/property_name_list.h"
#include "session/name_list.h"
#include "session/slot_guard.h"

namespace nKVSVAPI100 {

namespace {

bool IsDigit(unsigned char c) { return c >= '0' && c <= '9'; }

Status LookUpName(uint32_t session, const SvStr &name, int32_t *indexOut) {
  cSlotGuard guard(session, &tSessionSlot::listGuard);
  if (!guard) return guard.status();
  const Status status =
      EnsurePropertyNameList(session, kvPropSession_List, guard.slot().sessionNameList);
  if (status < 0) return status;
  const int32_t index =
      guard.slot().sessionNameList->Find(reinterpret_cast<const char *>(name.str), name.cnt);
  *indexOut = index;
  return index < 0 ? kvErrSubIdNameUnknown : 0;
}

}  // namespace

int32_t ParseDecimalString(const SvStr &text) {
  if (text.cnt < 1) return 0;
  uint32_t value = 0;
  for (int32_t i = 0; i < text.cnt; ++i) {
    if (!IsDigit(text.str[i])) return -1;
    value = value * 10u + static_cast<uint32_t>(text.str[i] - '0');
  }
  return static_cast<int32_t>(value);
}

Status SessionNameToIndex(uint32_t session, const SvHandle *subId, int32_t *indexOut) {
  if (subId == nullptr || *subId == nullptr || **subId == nullptr ||
      static_cast<const SvStr *>(**subId)->cnt <= 0) {
    *indexOut = 0;
    return 0;
  }
  const SvStr &name = *static_cast<const SvStr *>(**subId);
  if (IsDigit(name.str[0])) {
    *indexOut = ParseDecimalString(name);
    return *indexOut < 0 ? kvErrSubIdNumberInvalid : 0;
  }
  try {
    return LookUpName(session, name, indexOut);
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }
}

}  // namespace nKVSVAPI100
