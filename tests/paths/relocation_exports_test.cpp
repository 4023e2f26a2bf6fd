// The exports of the shared library find the relocation library by its soname.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "kvsvapi.h"
#include "paths/relocation_root.h"

namespace {

const kvsvtest::cRelocationRoot gRoot;

TEST(RelocationExports, ErrorLogDirectoryBelowTheRoot) {
  const std::string name = "eErrorLogDir";
  const std::string expected = gRoot.Path() + "/var/lib/kvor/log";
  uint64_t size = 0;
  ASSERT_EQ(kvsvPathGetMultibyteStringSizeInBytes(name.data(), name.size(), &size), 0);
  ASSERT_EQ(size, expected.size() + 1);
  std::vector<char> buffer(size);
  ASSERT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), size, buffer.data()), 0);
  EXPECT_EQ(std::string(buffer.data()), expected);
}

}  // namespace
