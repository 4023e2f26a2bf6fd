// Status texts: one for each status the driver makes, a generic one naming the number for any
// other, always terminated within the caller's size.
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

constexpr int32_t kDriverStatuses[] = {
    kvsimErrInternal,         kvsimErrOutOfMemory,
    kvsimErrNullPointer,      kvsimErrInvalidArgument,
    kvsimErrInvalidSession,   kvsimErrInvalidObject,
    kvsimErrTooManySessions,  kvsimErrTooManySystems,
    kvsimErrUnknownInterface, kvsimErrInvalidMode,
    kvsimErrInvalidList,      kvsimErrWrongMode,
    kvsimErrWrongProtocol,    kvsimErrInvalidScope,
    kvsimErrPropertyUnknown,  kvsimErrPropertyReadOnly,
    kvsimErrPropertySize,     kvsimErrBufferTooSmall,
    kvsimErrInvalidSubIndex,  kvsimErrTimeout,
    kvsimErrSessionCleared,   kvsimErrInvalidCondition,
    kvsimErrInvalidTerminal,  kvsimErrNotConnected,
    kvsimErrInvalidDatabase,  0,
};

TEST_F(KvorStatusText, EveryStatusOfTheDriverHasATextOfItsOwn) {
  std::set<std::string> texts;
  for (int32_t status : kDriverStatuses) {
    const std::string text = TextOf(status);
    EXPECT_GT(text.size(), 10u) << std::hex << status;
    EXPECT_EQ(text.find("Unknown"), std::string::npos) << std::hex << status << ": " << text;
    EXPECT_TRUE(texts.insert(text).second) << "shared text: " << text;
  }
}

TEST_F(KvorStatusText, AnyOtherStatusIsNamedByItsNumber) {
  const struct {
    int32_t status;
    const char *text;
  } cases[] = {
      {static_cast<int32_t>(0xBFF63FFF), "Unknown error (status 0xBFF63FFF)."},
      {static_cast<int32_t>(0xBFF62FFF), "Unknown error (status 0xBFF62FFF)."},
      {-1, "Unknown error (status 0xFFFFFFFF)."},
      {0x3FF62001, "Unknown warning (status 0x3FF62001)."},
  };
  for (const auto &c : cases) EXPECT_EQ(TextOf(c.status), c.text);
}

TEST_F(KvorStatusText, TheBindingsStatusesHaveTexts) {
  EXPECT_EQ(TextOf(static_cast<int32_t>(0xBFF63020)), "The session reference is invalid.");
  EXPECT_EQ(TextOf(static_cast<int32_t>(0xBFF630B0)), "The output array could not be allocated.");
}

TEST_F(KvorStatusText, TheTextIsCutToTheSizeAndAlwaysTerminated) {
  for (int32_t status : {static_cast<int32_t>(kvsimErrTimeout), -1}) {
    const std::string whole = TextOf(status);
    for (uint32_t size = 1; size <= whole.size() + 2; ++size) {
      std::vector<char> buffer(size + 8, 'X');
      kvStatusToString(status, size, buffer.data());
      const size_t kept = std::min<size_t>(whole.size(), size - 1);
      EXPECT_EQ(std::string(buffer.data()), whole.substr(0, kept)) << "size " << size;
      EXPECT_EQ(buffer[kept], '\0') << "size " << size;
      for (size_t i = size; i < buffer.size(); ++i) {
        ASSERT_EQ(buffer[i], 'X') << "byte " << i << " written past size " << size;
      }
    }
  }
}

TEST_F(KvorStatusText, SizeZeroWritesNothing) {
  char text[8];
  std::memset(text, 'X', sizeof text);
  kvStatusToString(kvsimErrTimeout, 0, text);
  EXPECT_EQ(std::string(text, sizeof text), std::string(sizeof text, 'X'));
  kvStatusToString(kvsimErrTimeout, 16, nullptr);
}

}  // namespace
