// Status texts: one for each status the driver makes, a generic one naming the number for any
// other, always terminated within the caller's size.
#include <algorithm>
#include <cstring>
#include <set>
#include <string>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorStatusText = KvorTest;

std::string TextOf(int32_t status) {
  char text[256];
  std::memset(text, 'X', sizeof text);
  kvStatusToString(status, sizeof text, text);
  EXPECT_NE(std::memchr(text, '\0', sizeof text), nullptr);
  return text;
}

TEST_F(KvorStatusText, EveryStatusOfTheDriverHasATextOfItsOwn) {
  std::set<std::string> texts = {TextOf(0)};
  EXPECT_EQ(texts.begin()->find("Unknown"), std::string::npos) << "success has a text too";
  for (int32_t status :
       {kvsimErrInternal,         kvsimErrOutOfMemory,     kvsimErrNullPointer,
        kvsimErrInvalidArgument,  kvsimErrInvalidSession,  kvsimErrInvalidObject,
        kvsimErrTooManySessions,  kvsimErrTooManySystems,  kvsimErrUnknownInterface,
        kvsimErrInvalidMode,      kvsimErrInvalidList,     kvsimErrWrongMode,
        kvsimErrWrongProtocol,    kvsimErrInvalidScope,    kvsimErrPropertyUnknown,
        kvsimErrPropertyReadOnly, kvsimErrPropertySize,    kvsimErrBufferTooSmall,
        kvsimErrInvalidSubIndex,  kvsimErrTimeout,         kvsimErrSessionCleared,
        kvsimErrInvalidCondition, kvsimErrInvalidTerminal, kvsimErrNotConnected,
        kvsimErrInvalidDatabase}) {
    const std::string text = TextOf(status);
    EXPECT_GT(text.size(), 10u) << std::hex << status;
    EXPECT_EQ(text.find("Unknown"), std::string::npos) << std::hex << status << ": " << text;
    EXPECT_TRUE(texts.insert(text).second) << "shared text: " << text;
  }
  for (int32_t status = kvsimErrDatabaseNotFound; status <= kvsimErrSignalLayout; ++status) {
    const std::string text = TextOf(status);
    EXPECT_EQ(text.find("Unknown"), std::string::npos) << std::hex << status << ": " << text;
    EXPECT_TRUE(texts.insert(text).second) << "shared text: " << text;
  }
}

TEST_F(KvorStatusText, TheBindingsStatusesHaveTextsAndAnyOtherIsNamedByItsNumber) {
  const struct {
    int32_t status;
    const char *text;
  } cases[] = {
      {static_cast<int32_t>(0xBFF63020), "The session reference is invalid."},
      {static_cast<int32_t>(0xBFF630B0), "The output array could not be allocated."},
      {static_cast<int32_t>(0xBFF63FFF), "Unknown error (status 0xBFF63FFF)."},
      {static_cast<int32_t>(0xBFF62FFF), "Unknown error (status 0xBFF62FFF)."},
      {-1, "Unknown error (status 0xFFFFFFFF)."},
      {0x3FF62001, "Unknown warning (status 0x3FF62001)."},
  };
  for (const auto &c : cases) EXPECT_EQ(TextOf(c.status), c.text);
}

TEST_F(KvorStatusText, TheTextIsCutToTheSizeAndAlwaysTerminated) {
  for (int32_t status : {static_cast<int32_t>(kvsimErrTimeout), -1}) {
    const std::string whole = TextOf(status);
    for (uint32_t size = 0; size <= whole.size() + 2; ++size) {
      SCOPED_TRACE(testing::Message() << std::hex << status << std::dec << " size " << size);
      std::vector<char> buffer(size + 8, 'X');
      kvStatusToString(status, size, buffer.data());
      const size_t kept = size == 0 ? 0 : std::min<size_t>(whole.size(), size - 1);
      if (size > 0) {
        EXPECT_EQ(std::string(buffer.data()), whole.substr(0, kept));
      }
      EXPECT_EQ(std::count(buffer.begin() + size, buffer.end(), 'X'), 8) << "written past size";
    }
  }
  kvStatusToString(kvsimErrTimeout, 16, nullptr);  // No buffer: nothing to write.
}

}  // namespace
