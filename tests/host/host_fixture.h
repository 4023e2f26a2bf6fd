// Every host test starts from a reset stand-in and must give back every handle, path and variant
// that it made. Also: readers for host data, and registering a reference the way the library does.
#ifndef KVSV_TESTS_HOST_HOST_FIXTURE_H
#define KVSV_TESTS_HOST_HOST_FIXTURE_H

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "kvsvplatform.h"
#include "svsim.h"

// Text of a string handle.
inline std::string Text(SvHandle string) {
  const int32_t length = svsimReadString(string, nullptr, 0);
  std::string text(static_cast<size_t>(length) + 1, '\0');
  svsimReadString(string, &text[0], text.size());
  text.resize(static_cast<size_t>(length));
  return text;
}

inline bool AllBytesAre(const void *block, size_t size, unsigned char value) {
  const auto *bytes = static_cast<const unsigned char *>(block);
  for (size_t i = 0; i < size; ++i)
    if (bytes[i] != value) return false;
  return true;
}

// The arguments of svRegisterRefKind3, as the library passes them for a session.
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

// Every text in a string handle of its own, disposed of after the call: the host must copy them.
inline int32_t Register(const ReferenceArgs &a, SvRefnum *cookie) {
  SvHandle texts[] = {svsimMakeString(a.name),      svsimMakeString(a.kind),
                      svsimMakeString(a.className), svsimMakeString(a.libraryPattern),
                      svsimMakeString(a.openName),  svsimMakeString(a.closeName)};
  const int32_t status =
      svRegisterRefKind3(texts[0], a.handle, texts[1], texts[2], a.c21, cookie, a.c8, texts[3],
                         a.c1, texts[4], texts[5], a.z0, a.z1, a.keep);
  for (SvHandle h : texts) svDisposeHandle(h);
  return status;
}

class HostTest : public ::testing::Test {
 protected:
  void SetUp() override {
    liveHandles_ = svsimReset();
    livePaths_ = svsimLivePaths();
    liveVariants_ = svsimLiveVariants();
  }

  void TearDown() override {
    svsimReset();
    EXPECT_EQ(svsimLiveHandles(), liveHandles_) << "handles left alive";
    EXPECT_EQ(svsimLivePaths(), livePaths_) << "paths left alive";
    EXPECT_EQ(svsimLiveVariants(), liveVariants_) << "variants left alive";
  }

 private:
  uint64_t liveHandles_ = 0;
  uint64_t livePaths_ = 0;
  uint64_t liveVariants_ = 0;
};

#endif
