// Registering a reference the way the library does: every text in a string handle of its own,
// the protocol constants as they stand, the handles disposed of after the call.
#ifndef KVSV_TESTS_HOST_REFERENCE_ARGS_H
#define KVSV_TESTS_HOST_REFERENCE_ARGS_H

#include <cstdint>

#include "kvsvplatform.h"
#include "svsim.h"

struct ReferenceArgs {
  const char *name = "___kvorSesn#00010002";
  uint32_t handle = 0x00010002;
  const char *kind = "kvor";
  const char *className = "KVOR Session";
  const char *libraryPattern = "kvsvapi.*";
  const char *openName = "kvsvSessionOpen";
  const char *closeName = "kvsvSessionClose";
  int32_t c21 = 21, c8 = 8, c1 = 1, z0 = 0, z1 = 0;
  int32_t keep = 1;
};

inline int32_t Register(const ReferenceArgs &a, SvRefnum *cookie) {
  SvHandle name = svsimMakeString(a.name);
  SvHandle kind = svsimMakeString(a.kind);
  SvHandle className = svsimMakeString(a.className);
  SvHandle pattern = svsimMakeString(a.libraryPattern);
  SvHandle open = svsimMakeString(a.openName);
  SvHandle close = svsimMakeString(a.closeName);
  const int32_t status = svRegisterRefKind3(name, a.handle, kind, className, a.c21, cookie, a.c8,
                                            pattern, a.c1, open, close, a.z0, a.z1, a.keep);
  for (SvHandle h : {name, kind, className, pattern, open, close}) svDisposeHandle(h);
  return status;
}

#endif
