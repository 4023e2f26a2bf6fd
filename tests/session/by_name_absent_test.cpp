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

TEST(UnregisterByName, MissingHostOperationIsReportedAndLookedForAgain) {
  kvsvtest::cFakeErrorLog log;
  svsimReset();
  SvHandle name = svsimMakeString("___kvorDev#ffeeddcc");
  SvRefnum reference = 0;
  ASSERT_EQ(RegisterReference(kClassDevice, name, 0x01010100u, &reference), 0);
  const std::string text = "___kvorDev#ffeeddcc";
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), kvErrInternal);
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), kvErrInternal);
  const auto records = log.Records();
  ASSERT_EQ(records.size(), 2u);
  for (const auto &record : records) {
    EXPECT_EQ(record.value.File(), 16u);
    EXPECT_EQ(record.value.Line(), 2618u);
    EXPECT_EQ(record.value.info, 0u);
  }
  EXPECT_EQ(svsimRefCount(), 1);

  void *byName = dlopen(KVSV_BY_NAME_LIBRARY, RTLD_NOW | RTLD_GLOBAL);
  ASSERT_NE(byName, nullptr) << dlerror();
  EXPECT_EQ(UnregisterReferenceByName(kClassDevice, &text), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(log.Records().size(), 2u);
  svDisposeHandle(name);
}

}  // namespace
