// kvsvSessionGetPropExPath and kvsvSessionSetPropExPath: a file property of the driver, a text,
// as a host path.
#include <cstdint>
#include <cstring>

#include "core/internal_error.h"
#include "kvsvapi.h"
#include "property/session_property_call.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLinePathFromText = 2185;

// The driver's text into `scratch` as a counted string, then into the host's path.
Status ReadPath(uint32_t handle, uint32_t id, SvHandle &scratch, SvPath *value) {
  if (value == nullptr) return kvErrNullArgument;
  const Status status = ReadSizedIntoHandle<tSessionPropertyCalls>(
      handle, id, &scratch, kStringSlack, [&scratch](Status, uint32_t size) {
        static_cast<SvStr *>(*scratch)->cnt = size != 0 ? static_cast<int32_t>(size - 1) : 0;
      });
  if (status < 0) return status;
  const int32_t parsed = svStringToPath(scratch, value);
  if (parsed != 0) {
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionOpenClose, kLinePathFromText,
                               static_cast<uint32_t>(parsed));
  }
  return status;
}

// The host's path as the driver's NUL-terminated text; a path without text goes as "".
Status WritePath(uint32_t handle, uint32_t id, const SvPath *value) {
  SvHandle text = value != nullptr ? svPathCText(*value) : nullptr;
  Status status = 0;
  if (text != nullptr && *text != nullptr) {
    const auto *characters = static_cast<const char *>(*text);
    status = tSessionPropertyCalls::Set(
        handle, id, static_cast<uint32_t>(std::strlen(characters) + 1), characters);
  } else {
    status = tSessionPropertyCalls::Set(handle, id, 1, "");
  }
  DisposeHandle(&text);
  return status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExPath(uint32_t session, SvHandle *,
                                                           uint32_t id, SvPath *value,
                                                           SvHandle *info) {
  // The text is disposed of behind the annotation.
  SvHandle scratch = nullptr;
  const Status status = RunSessionPropertyCall(
      session, id, info, [&](uint32_t handle) { return ReadPath(handle, id, scratch, value); });
  DisposeHandle(&scratch);
  return status;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExPath(uint32_t session, SvHandle *,
                                                           uint32_t id, SvPath *value,
                                                           SvHandle *info) {
  return RunSessionPropertyCall(session, id, info,
                                [&](uint32_t handle) { return WritePath(handle, id, value); });
}
