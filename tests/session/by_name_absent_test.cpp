// A host without the by-name removal: each removal is reported, and a host that gains the
// operation later is found at the next call.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <string>

#include "session/kvorutility.h"
#include "support/fake_error_log.h"
#include "svsim.h"

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
  for (const auto &record : log.Records())
    EXPECT_EQ(std::make_pair(record.value.File(), record.value.Line()), std::make_pair(16u, 2618u));
  EXPECT_EQ(svsimRefCount(), 1);
  ASSERT_NE(dlopen(KVSV_BY_NAME_LIBRARY, RTLD_NOW | RTLD_GLOBAL), nullptr) << dlerror();
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(log.Records().size(), 2u);
  svDisposeHandle(name);
}

}  // namespace
