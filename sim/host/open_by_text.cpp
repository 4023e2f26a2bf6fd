// The host's own open of a reference by its text, as a program's front panel makes it: the open
// export that a library registered for the reference's class is found in the process by its name
// and called, and the reference is kept, so that the end of the program calls its close export.
#include <dlfcn.h>

#include "svsim.h"

namespace {

using OpenExport = int32_t (*)(SvHandle *name, uint32_t *handle, uint64_t context);

// Constants of the registration protocol; the reference is kept across programs' references.
constexpr int32_t kProtocol21 = 21;
constexpr int32_t kProtocol8 = 8;
constexpr int32_t kProtocol1 = 1;
constexpr int32_t kKeep = 1;

}  // namespace

extern "C" int32_t svsimOpenRefByText(const char *openName, const char *closeName,
                                      const char *className, const char *text,
                                      uint32_t *handle) {
  if (openName == nullptr || closeName == nullptr || className == nullptr || text == nullptr ||
      handle == nullptr)
    return SVSIM_REF_BAD_ARGUMENT;
  void *symbol = dlsym(RTLD_DEFAULT, openName);
  if (symbol == nullptr) return SVSIM_REF_NOT_FOUND;
  SvHandle texts[] = {svsimMakeString(text), svsimMakeString("kvor"), svsimMakeString(className),
                      svsimMakeString("kvsvapi.*"), svsimMakeString(openName),
                      svsimMakeString(closeName)};
  int32_t status = SVSIM_REF_NO_MEMORY;
  bool made = true;
  for (SvHandle h : texts) made = made && h != nullptr;
  if (made) {
    *handle = 0;
    reinterpret_cast<OpenExport>(symbol)(&texts[0], handle, 0);
    SvRefnum cookie = 0;
    status = svRegisterRefKind3(texts[0], *handle, texts[1], texts[2], kProtocol21, &cookie,
                                kProtocol8, texts[3], kProtocol1, texts[4], texts[5], 0, 0, kKeep);
  }
  for (SvHandle h : texts)
    if (h != nullptr) svDisposeHandle(h);
  return status;
}
