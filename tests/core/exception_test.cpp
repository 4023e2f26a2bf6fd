// The library's exception, and how an export turns whatever was thrown into a status.
#include <gtest/gtest.h>

#include <exception>
#include <new>
#include <stdexcept>

#include "core/exception_base.h"
#include "core/exception_to_status.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::cFakeErrorLog;

TEST(ExceptionBase, EachConstructorSetsItsKindAndShowsTheInfoWord) {
  const struct {
    cExceptionBase exception;
    uint32_t kind;
    uint32_t info;
    const char *text;
    uint32_t where[3];  // component, file, line
  } cases[] = {
      {{cExceptionBase::tUser{}, 22, 1, 76, 0xBFF63258},
       tInternalStatus::kUser,
       0xBFF63258,
       "0xBFF63258",
       {22, 1, 76}},
      {{cExceptionBase::tInternal{}, 22, 1, 59},
       tInternalStatus::kInternal,
       1,
       "0x00000001",
       {22, 1, 59}},
      {{cExceptionBase::tSystemService{}, 13, 14, 154, 0xABC},
       tInternalStatus::kSystemService,
       0xABC,
       "0x00000ABC",
       {13, 14, 154}},
      {{cExceptionBase::tSystemService{}, 13, 14, 413, 0xFFFFFFFF},
       tInternalStatus::kSystemService,
       0xFFFFFFFF,
       "0xFFFFFFFF",
       {13, 14, 413}},
  };
  for (const auto &c : cases) {
    const std::exception &standard = c.exception;
    EXPECT_STREQ(standard.what(), c.text);
    const tInternalStatus *held = c.exception.Status();
    EXPECT_TRUE(held->Failed()) << c.text;
    EXPECT_EQ(held->Kind(), c.kind) << c.text;
    EXPECT_EQ(held->info, c.info) << c.text;
    EXPECT_EQ(held->Component(), c.where[0]) << c.text;
    EXPECT_EQ(held->File(), c.where[1]) << c.text;
    EXPECT_EQ(held->Line(), c.where[2]) << c.text;
  }
}

// Classifies `thrown` as an export's catch-all would.
Status Classify(const std::exception_ptr &thrown, Status (*form)()) {
  try {
    std::rethrow_exception(thrown);
  } catch (...) {
    return form();
  }
}

struct tRecordExpected {
  uint32_t line;
  uint32_t info;
};

TEST(ExceptionToStatusRunMode, ReportsWhatItDoesNotExpect) {
  const struct {
    const char *name;
    std::exception_ptr thrown;
    Status status;
    bool reported;
    tRecordExpected record;
  } cases[] = {
      {"library exception",
       std::make_exception_ptr(cExceptionBase(cExceptionBase::tUser{}, 22, 1, 76, 0xBFF63258)),
       kvErrInternal,
       true,
       {154, 0xBFF63258}},
      {"out of memory", std::make_exception_ptr(std::bad_alloc()), kvErrOutOfMemory, false, {}},
      {"array too long",
       std::make_exception_ptr(std::bad_array_new_length()),
       kvErrOutOfMemory,
       false,
       {}},
      {"standard exception",
       std::make_exception_ptr(std::runtime_error("x")),
       kvErrInternal,
       true,
       {162, 0xBFF63001}},
  };
  for (const auto &c : cases) {
    cFakeErrorLog log;
    EXPECT_EQ(Classify(c.thrown, &ExceptionToStatusRunMode), c.status) << c.name;
    const auto records = log.Records();
    ASSERT_EQ(records.size(), c.reported ? 1u : 0u) << c.name;
    if (!c.reported) continue;
    const tInternalStatus &value = records[0].value;
    EXPECT_EQ(value.Component(), 13u) << c.name;
    EXPECT_EQ(value.File(), 14u) << c.name;
    EXPECT_EQ(value.Line(), c.record.line) << c.name;
    EXPECT_EQ(value.info, c.record.info) << c.name;
  }
}

TEST(ExceptionToStatusRunMode, RethrowsWhatIsNotAStandardException) {
  cFakeErrorLog log;
  EXPECT_THROW(Classify(std::make_exception_ptr(42), &ExceptionToStatusRunMode), int);
  EXPECT_TRUE(log.Records().empty());
}

TEST(ExceptionToStatusPath, FamilyCodesPassAndEverythingElseIsInternal) {
  const struct {
    const char *name;
    std::exception_ptr thrown;
    Status status;
  } cases[] = {
      {"buffer too small",
       std::make_exception_ptr(cExceptionBase(cExceptionBase::tUser{}, 22, 1, 76, 0xBFF63258)),
       kvErrBufferTooSmall},
      {"null buffer",
       std::make_exception_ptr(cExceptionBase(cExceptionBase::tUser{}, 22, 1, 71, 0xBFF63259)),
       kvErrNullBuffer},
      {"foreign user code",
       std::make_exception_ptr(cExceptionBase(cExceptionBase::tUser{}, 22, 1, 63, 0x80001234)),
       kvErrInternal},
      {"internal kind",
       std::make_exception_ptr(cExceptionBase(cExceptionBase::tInternal{}, 22, 1, 59)),
       kvErrInternal},
      {"out of memory", std::make_exception_ptr(std::bad_alloc()), kvErrOutOfMemory},
      {"standard exception", std::make_exception_ptr(std::logic_error("x")), kvErrInternal},
      {"foreign exception", std::make_exception_ptr(42), kvErrInternal},
  };
  for (const auto &c : cases) {
    cFakeErrorLog log;
    EXPECT_EQ(Classify(c.thrown, &ExceptionToStatusPath), c.status) << c.name;
    EXPECT_TRUE(log.Records().empty()) << c.name;
  }
}

TEST(ExceptionToStatusPath, AForeignUserCodeLeavesTheExceptionMarkedInternal) {
  const std::exception_ptr thrown =
      std::make_exception_ptr(cExceptionBase(cExceptionBase::tUser{}, 22, 1, 63, 0x80001234));
  ASSERT_EQ(Classify(thrown, &ExceptionToStatusPath), kvErrInternal);
  try {
    std::rethrow_exception(thrown);
  } catch (const cExceptionBase &e) {
    EXPECT_EQ(e.Status()->Kind(), uint32_t{tInternalStatus::kInternal});
    EXPECT_EQ(e.Status()->info, 0x80001234u);
    EXPECT_EQ(e.Status()->Line(), 63u);
  }
}

}  // namespace
