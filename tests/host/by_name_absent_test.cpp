// A host without the by-name removal: a program that does not link libsvhostbyname.so finds no
// such operation, although the rest of the reference manager is there.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include "host_fixture.h"

namespace {

using ByNameAbsent = HostTest;

TEST_F(ByNameAbsent, TheLookupFindsNothing) {
  EXPECT_EQ(dlsym(RTLD_DEFAULT, "svUnregisterRefByName"), nullptr);
  EXPECT_NE(dlsym(RTLD_DEFAULT, "svUnregisterRef"), nullptr);
}

}  // namespace
