// Every host test starts from a reset stand-in and must give back every handle, path and variant
// that it made.
#ifndef KVSV_TESTS_HOST_HOST_FIXTURE_H
#define KVSV_TESTS_HOST_HOST_FIXTURE_H

#include <gtest/gtest.h>

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

// Count of a string handle, read from its block.
inline int32_t Count(SvHandle string) { return *static_cast<int32_t *>(*string); }

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
