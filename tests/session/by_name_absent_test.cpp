// A host without the by-name removal: each removal is reported, and a host that gains the
// operation later is found at the next call.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <string>

#include "session/kvorutility.h"
#include "support/session_fixture.h"

namespace {

using namespace nKVSVAPI100;

TEST(UnregisterByName, AMissingHostOperationIsReportedAndLookedForAgain) {
  kvsvtest::cFakeErrorLog log;
  svsimReset();
  SvHandle name = svsimMakeString("___kvorDev#ffeeddcc");
  SvRefnum reference = 0;
  ASSERT_EQ(RegisterReference(kClassDevice, name, 0x01010100u, &reference), 0);
  const std::string text = "___kvorDev#ffeeddcc";
  for (int call = 0; call < 2; ++call)
    EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), kvErrInternal);
  EXPECT_EQ(ReportLines(log), (std::vector<uint32_t>{2618, 2618}));
  EXPECT_EQ(svsimRefCount(), 1);
  ASSERT_NE(dlopen(KVSV_BY_NAME_LIBRARY, RTLD_NOW | RTLD_GLOBAL), nullptr) << dlerror();
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(ReportLines(log).size(), 2u) << "found: nothing more to report";
  svDisposeHandle(name);
}

}  // namespace
