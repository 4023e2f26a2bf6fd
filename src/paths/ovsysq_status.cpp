#include "paths/ovsysq_status.h"

#include <cstring>

namespace ovsysq {

namespace {

// strerror_r comes in two shapes; both end up as a text.
[[maybe_unused]] const char *ErrnoText(int result, const char *buffer) { return result == 0 ? buffer : ""; }
[[maybe_unused]] const char *ErrnoText(const char *result, const char *) { return result; }

}  // namespace

const char *ErrorConstant(int32_t code) {
  switch (code) {
    case kMemoryFull: return "ovapalerr_memoryFull";
    case kResourceNotFound: return "ovapalerr_resourceNotFound";
    case kOsFault: return "ovapalerr_osFault";
    case kObjectNameCollision: return "ovapalerr_objectNameCollision";
    default: return "unknown";
  }
}

jsonz::tRetry RetryFor(tJsonStatus &status) {
  jsonz::tRetry retry;
  retry.fn = &nKVSVAPI100::GrowJsonStatusRetry;
  retry.arg = &status;
  return retry;
}

char *SetOsFault(tJsonStatus &status, int32_t code, const char *file, uint32_t line,
                 int errnoValue, const char *desc) {
  char *cursor = nKVSVAPI100::SetJsonStatusError(status, code, ErrorConstant(code), file, line);
  if (cursor == nullptr) return nullptr;
  const jsonz::tRetry retry = RetryFor(status);
  char text[256] = {0};
  const char *errnoString = ErrnoText(strerror_r(errnoValue, text, sizeof text), text);
  cursor = jsonz::AddObject(cursor, "internal_error", retry);
  cursor = jsonz::AddString(cursor, "api", "errno", retry);
  cursor = jsonz::AddInt32(cursor, "code", errnoValue, retry);
  cursor = jsonz::AddString(cursor, "string", errnoString, retry);
  cursor = jsonz::LeaveObject(cursor);
  cursor = jsonz::AddObject(cursor, "ovsysq_debug", retry);
  return jsonz::AddString(cursor, "desc", desc, retry);
}

}  // namespace ovsysq
