#include "diagnostics/ovdynlib.h"

#include <dlfcn.h>

#include "diagnostics/jsonz.h"

namespace nKVSVAPI100 {

namespace {

constexpr char kLoaderSource[] = "src/diagnostics/ovdynlib.cpp";
constexpr uint32_t kLoadLine = 110;
constexpr uint32_t kSymbolLine = 185;

// Records -52005 by the worst-of rule with the detail of a failed load or lookup; `nameKey` and
// `name` say what was asked for. Whatever does not fit is left out: the document stays valid.
void DescribeFailure(tJsonStatus &status, uint32_t line, const char *nameKey, const char *name) {
  const char *reason = dlerror();
  const jsonz::tRetry retry{&GrowJsonStatusRetry, &status};
  char *cursor = SetJsonStatusError(status, kOvdynlibFailed, "ovapalerr_invalidParameter",
                                    kLoaderSource, line);
  // The loader's debug text is used for a failed lookup as well.
  char *debug = jsonz::AddObject(cursor, "ovdynlib_debug", retry);
  debug = jsonz::AddString(debug, "debug", "failed to ovdynlib_load library", retry);
  debug = jsonz::AddString(debug, nameKey, name != nullptr ? name : "", retry);
  char *internal = jsonz::AddObject(jsonz::LeaveObject(debug), "internal_error", retry);
  internal = jsonz::AddString(internal, "api", "dlerror", retry);
  jsonz::AddString(internal, "string", reason != nullptr ? reason : "", retry);
}

}  // namespace

void *ovdynlib_load(const char *fileName, int flags, tJsonStatus &status) {
  if (status.code < 0) return nullptr;
  void *handle = dlopen(fileName, flags);
  if (handle != nullptr) return handle;
  DescribeFailure(status, kLoadLine, "path", fileName);
  return nullptr;
}

void *ovdynlib_symbol(void *handle, const char *name, tJsonStatus &status) {
  if (status.code < 0) return nullptr;
  dlerror();
  void *address = dlsym(handle, name);
  if (address != nullptr) return address;
  DescribeFailure(status, kSymbolLine, "ovdynlib_symbol", name);
  return nullptr;
}

void ovdynlib_close(void *handle) {
  if (handle != nullptr) dlclose(handle);
}

}  // namespace nKVSVAPI100
