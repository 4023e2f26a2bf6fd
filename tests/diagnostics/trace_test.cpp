// The idle trace framework: the console destination's operations, seen through its replaceable
// output, so that nothing reaches the real console.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <string>

#include "diagnostics/console_trace_destination.h"
#include "diagnostics/trace.h"

namespace {

using namespace nKVSVAPI100;

std::string gPrinted;

int Capture(const char *text, std::FILE *) {
  gPrinted += text;
  return 0;
}

class ConsoleTrace : public testing::Test {
 protected:
  void SetUp() override {
    saved_ = gTraceOutput;
    gTraceOutput = &Capture;
    gPrinted.clear();
  }
  void TearDown() override { gTraceOutput = saved_; }

 private:
  tTraceOutput saved_ = nullptr;
};

TEST_F(ConsoleTrace, WritesTextAndCutsByLengthAndAt512Bytes) {
  iTraceDestination &console = ConsoleTraceDestination();
  console.Write("100% sure");
  console.Write("abcdef", 3);
  EXPECT_EQ(gPrinted, "100% sureabc");
  gPrinted.clear();
  const std::string longText(2000, 'z');
  console.Write(longText.c_str());
  EXPECT_EQ(gPrinted, std::string(511, 'z'));
}

TEST_F(ConsoleTrace, DescribesItselfIntoABufferOfAnySize) {
  iTraceDestination &console = ConsoleTraceDestination();
  const struct {
    size_t size;
    const char *copied;
  } cases[] = {{64, " --destination apal"}, {20, " --destination apal"}, {5, " --d"}, {1, ""}};
  for (const auto &c : cases) {
    char buffer[64];
    std::memset(buffer, 'x', sizeof buffer);
    size_t needed = 0;
    char *end = console.Describe(buffer, c.size, &needed);
    EXPECT_STREQ(buffer, c.copied) << c.size;
    EXPECT_EQ(end, buffer + std::strlen(c.copied)) << c.size;
    EXPECT_EQ(needed, 20u);
  }
}

}  // namespace
