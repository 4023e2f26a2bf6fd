// The log file itself, on logs built over a directory of the test's own: header lines, column
// offsets, the filter options, wrap-around, damaged headers and files that cannot be written.
#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <regex>
#include <string>
#include <vector>

#include "diagnostics/error_log.h"
#include "diagnostics/temp_dir.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::ReadFile;
using kvsvtest::WriteAt;

constexpr char kProgram[] = "diagnostics_tests";
constexpr size_t kLine = 128;
constexpr size_t kFirstRow = 7 * kLine;
const std::vector<std::string> kVersion{"KVOR driver 24.5.0f49"};

std::string Line(const std::string &file, size_t index) {
  return file.size() >= (index + 1) * kLine ? file.substr(index * kLine, kLine) : std::string();
}

std::string Padded(const std::string &text) { return text + std::string(126 - text.size(), ' ') + " \n"; }

class ErrorLogFile : public testing::Test {
 protected:
  std::string Base() const { return dir_.Path() + "/kvorErr.log"; }
  std::string File() const { return dir_.Path() + "/kvorErr_" + kProgram + ".log"; }
  // A report of the internal-error reporter's kind: system service, failed.
  static void WriteError(cErrorLog &log, uint32_t line) {
    log.WriteRow(true, 3, "System Service", 13, 9, line, 0xBFF63001, 0x8009C000 | line);
  }
  kvsvtest::cTempDir dir_;
};

TEST_F(ErrorLogFile, AFreshFileHasExactlyTheHeaderLines) {
  cErrorLog log(kVersion, Base().c_str());
  EXPECT_EQ(log.Path(), File());
  const std::string file = ReadFile(File());
  ASSERT_EQ(file.size(), kFirstRow);
  EXPECT_EQ(Line(file, 0), "Current Row: 0000      Max Num Rows: 001000" + std::string(83, ' ') + " \n");
  EXPECT_EQ(Line(file, 1),
            Padded("(1000) - Log Options: (Internal Errors, User Errors, Internal Warnings, User "
                   "Warnings)"));
  EXPECT_EQ(Line(file, 2), Padded("Date and Time Format YYYY-MM-DD HH:MM:SS (24-hour time)"));
  EXPECT_EQ(Line(file, 3), Padded("KVOR driver 24.5.0f49"));
  EXPECT_EQ(Line(file, 4), Padded(""));
  EXPECT_EQ(Line(file, 5),
            Padded("Row       Date and Time            Severity      Type           Component"
                   "      File       Line      Code (hex)      Info (hex)"));
  EXPECT_EQ(Line(file, 6), std::string(126, '-') + " \n");
  EXPECT_EQ(log.MaxRows(), 1000u);
}

TEST_F(ErrorLogFile, EveryColumnOfARowAtItsOffset) {
  cErrorLog log(kVersion, Base().c_str());
  WriteError(log, 1234);
  const std::string file = ReadFile(File());
  ASSERT_EQ(file.size(), kFirstRow + kLine);
  EXPECT_EQ(file.substr(13, 4), "0001");
  const std::string row = Line(file, 7);
  EXPECT_EQ(row.substr(0, 10), "0001      ");
  EXPECT_TRUE(std::regex_match(row.substr(10, 19),
                               std::regex("[0-9]{4}-[0-9]{2}-[0-9]{2} [0-9]{2}:[0-9]{2}:[0-9]{2}")))
      << row;
  EXPECT_EQ(row.substr(29, 6), std::string(6, ' '));
  EXPECT_EQ(row.substr(35, 14), "Error         ");
  EXPECT_EQ(row.substr(49, 15), "System Service ");
  EXPECT_EQ(row.substr(64, 9), "       13");
  EXPECT_EQ(row.substr(73, 10), "         9");
  EXPECT_EQ(row.substr(83, 11), "       1234");
  EXPECT_EQ(row.substr(94, 16), "      0xbff63001");
  EXPECT_EQ(row.substr(110, 16), "      0x8009c4d2");
  EXPECT_EQ(row.substr(126), " \n");
}

TEST_F(ErrorLogFile, KindNamesAndSeverityTexts) {
  const struct {
    bool failed;
    const char *kind;
    const char *column;
    const char *severity;
  } cases[] = {
      {true, "Internal", "Internal       ", "Error         "},
      {true, "fifteen chars..", "fifteen chars..", "Error         "},
      {true, "sixteen chars...", "????????       ", "Error         "},
      {true, nullptr, "????????       ", "Error         "},
      {false, "User", "User           ", "Warning       "},
  };
  cErrorLog log(kVersion, Base().c_str());
  WriteAt(File(), 128, "(1111)");
  log.Open(Base().c_str());
  size_t index = 7;
  for (const auto &c : cases) {
    log.WriteRow(c.failed, 2, c.kind, 13, 1, 1, 0, 0);
    const std::string row = Line(ReadFile(File()), index++);
    EXPECT_EQ(row.substr(49, 15), c.column) << (c.kind ? c.kind : "null");
    EXPECT_EQ(row.substr(35, 14), c.severity);
  }
}

TEST_F(ErrorLogFile, TheFourOptionsFilterRows) {
  // Rows offered, in order: internal error, user error, internal warning, user warning; and an
  // internal error of severity 3, which counts as 2.
  const struct {
    const char *options;
    const char *written;  // one character per offered row
  } cases[] = {
      {"(1000)", "10001"}, {"(0100)", "01000"}, {"(0010)", "00100"},
      {"(0001)", "00010"}, {"(1111)", "11111"}, {"(0000)", "00000"},
      {"(x0y0)", "10101"},  // anything but '0' switches an option on
  };
  for (const auto &c : cases) {
    { cErrorLog create(kVersion, Base().c_str()); }
    WriteAt(File(), 128, c.options);
    cErrorLog log(kVersion, Base().c_str());
    const struct {
      bool failed;
      uint32_t severity;
    } offered[] = {{true, 2}, {true, 1}, {false, 2}, {false, 1}, {true, 3}};
    for (size_t i = 0; i < 5; ++i) {
      const size_t before = ReadFile(File()).size();
      log.WriteRow(offered[i].failed, offered[i].severity, "Internal", 13, 1, 1, 0, 0);
      EXPECT_EQ(ReadFile(File()).size() > before, c.written[i] == '1') << c.options << " row " << i;
    }
    EXPECT_EQ(ReadFile(File()).substr(128, 6), c.options) << "the options are kept";
    unlink(File().c_str());
  }
}

TEST_F(ErrorLogFile, AHandEditedLimitOfFiveWrapsAndLeavesLaterRowsInPlace) {
  {
    cErrorLog log(kVersion, Base().c_str());
    for (uint32_t i = 1; i <= 7; ++i) WriteError(log, i);
  }
  WriteAt(File(), 37, "000005");
  cErrorLog log(kVersion, Base().c_str());
  EXPECT_EQ(log.MaxRows(), 5u);
  // The counter stands at 7, above the new limit: the next row goes to the first place.
  WriteError(log, 100);
  WriteError(log, 101);
  const std::string file = ReadFile(File());
  EXPECT_EQ(file.substr(13, 4), "0002");
  EXPECT_EQ(Line(file, 7).substr(0, 4), "0001");
  EXPECT_EQ(Line(file, 7).substr(83, 11), "        100");
  EXPECT_EQ(Line(file, 8).substr(0, 4), "0002");
  EXPECT_EQ(Line(file, 8).substr(83, 11), "        101");
  EXPECT_EQ(Line(file, 9).substr(83, 11), "          3");
  EXPECT_EQ(Line(file, 12).substr(0, 4), "0006");
  EXPECT_EQ(Line(file, 13).substr(0, 4), "0007");
  EXPECT_EQ(file.size(), kFirstRow + 7 * kLine);
  for (uint32_t i = 102; i <= 104; ++i) WriteError(log, i);
  WriteError(log, 105);  // the sixth row since the edit wraps again
  const std::string wrapped = ReadFile(File());
  EXPECT_EQ(wrapped.substr(13, 4), "0001");
  EXPECT_EQ(Line(wrapped, 7).substr(83, 11), "        105");
  EXPECT_EQ(Line(wrapped, 11).substr(83, 11), "        104");
}

TEST_F(ErrorLogFile, RowNumbersAboveNineThousandNineHundredNinetyNineWiden) {
  { cErrorLog create(kVersion, Base().c_str()); }
  WriteAt(File(), 37, "20000 ");
  cErrorLog log(kVersion, Base().c_str());
  WriteAt(File(), 13, "12344");
  WriteError(log, 9);
  const std::string file = ReadFile(File());
  EXPECT_EQ(file.substr(13, 6), "12345 ");
  EXPECT_EQ(file.substr((7 + 12344) * kLine, 10), "12345     ");
}

TEST_F(ErrorLogFile, ADamagedHeaderGetsTheFileRewritten) {
  const struct {
    const char *what;
    long offset;
    const char *text;
  } cases[] = {
      {"opening parenthesis", 128, "X"},
      {"closing parenthesis", 133, "]"},
  };
  for (const auto &c : cases) {
    {
      cErrorLog log(kVersion, Base().c_str());
      WriteAt(File(), 128, "(1111)");
      log.Open(Base().c_str());
      WriteError(log, 1);
      WriteError(log, 2);
    }
    WriteAt(File(), 37, "000050");
    WriteAt(File(), c.offset, c.text);
    cErrorLog log(kVersion, Base().c_str());
    const std::string file = ReadFile(File());
    EXPECT_EQ(file.size(), kFirstRow) << c.what;
    EXPECT_EQ(file.substr(128, 6), "(1000)") << c.what;
    EXPECT_EQ(file.substr(13, 4), "0000") << c.what;
    EXPECT_EQ(log.MaxRows(), 1000u) << c.what;
    EXPECT_EQ(log.Option(cErrorLog::kUserWarnings), 0) << c.what;
    unlink(File().c_str());
  }
}

TEST_F(ErrorLogFile, AnUnreadableLimitFallsBackAndAnUnreadableCounterRestarts) {
  {
    cErrorLog log(kVersion, Base().c_str());
    WriteError(log, 1);
    WriteError(log, 2);
  }
  WriteAt(File(), 37, "abc");
  cErrorLog log(kVersion, Base().c_str());
  EXPECT_EQ(log.MaxRows(), 1000u);
  WriteAt(File(), 13, "----");
  WriteError(log, 3);
  const std::string file = ReadFile(File());
  EXPECT_EQ(file.substr(13, 4), "0001");
  EXPECT_EQ(Line(file, 7).substr(83, 11), "          3");
  EXPECT_EQ(Line(file, 8).substr(83, 11), "          2");
}

TEST_F(ErrorLogFile, ReopeningKeepsRowsAndRewritesTheVersionLine) {
  {
    cErrorLog log(kVersion, Base().c_str());
    WriteError(log, 1);
  }
  cErrorLog log(std::vector<std::string>{"KVOR driver 25.0.0b1"}, Base().c_str());
  const std::string file = ReadFile(File());
  EXPECT_EQ(Line(file, 3), Padded("KVOR driver 25.0.0b1"));
  EXPECT_EQ(Line(file, 7).substr(83, 11), "          1");
  EXPECT_EQ(file.substr(13, 4), "0001");
}

TEST_F(ErrorLogFile, AMissingFileIsCreatedAgainAtTheNextRow) {
  cErrorLog log(kVersion, Base().c_str());
  unlink(File().c_str());
  WriteError(log, 8);
  const std::string file = ReadFile(File());
  ASSERT_EQ(file.size(), kFirstRow + kLine);
  EXPECT_EQ(Line(file, 7).substr(83, 11), "          8");
}

TEST_F(ErrorLogFile, VersionLinesBeyondAThousandAreDropped) {
  const std::vector<std::string> many(1001, "v");
  cErrorLog log(many, Base().c_str());
  WriteError(log, 1);
  const std::string file = ReadFile(File());
  EXPECT_EQ(file.size(), (1000 + 6 + 1) * kLine);
  EXPECT_EQ(Line(file, 1006).substr(0, 4), "0001");
}

TEST_F(ErrorLogFile, ANullNameOrAFileThatCannotBeWrittenDropsTheRow) {
  cErrorLog off(kVersion, nullptr);
  EXPECT_STREQ(off.Path(), "");
  WriteError(off, 1);
  EXPECT_TRUE(ReadFile(File()).empty());

  const std::string missing = dir_.Path() + "/no/such/dir/kvorErr.log";
  cErrorLog absent(kVersion, missing.c_str());
  WriteError(absent, 1);
  EXPECT_EQ(access((dir_.Path() + "/no").c_str(), F_OK), -1);

  if (geteuid() == 0) GTEST_SKIP() << "permissions do not bind the superuser";
  const std::string locked = dir_.Path() + "/locked";
  ASSERT_EQ(mkdir(locked.c_str(), 0500), 0);
  cErrorLog readOnly(kVersion, (locked + "/kvorErr.log").c_str());
  WriteError(readOnly, 1);
  EXPECT_EQ(access((locked + "/kvorErr_" + kProgram + ".log").c_str(), F_OK), -1);
}

TEST(ErrorLogName, TheProgramsNameGoesBeforeTheLastDot) {
  const std::string program = std::string("_") + kProgram;
  const struct {
    std::string given;
    std::string result;
  } cases[] = {
      {"/var/lib/kvor/log/kvorErr.log", "/var/lib/kvor/log/kvorErr" + program + ".log"},
      {"/a.b/log", "/a" + program + ".b/log"},
      {"/tmp/plain", "/tmp/plain" + program},
      {"/" + std::string(258 - program.size(), 'x'), "/" + std::string(258 - program.size(), 'x') + program},
      {"/" + std::string(259 - program.size(), 'x'), ""},
  };
  for (const auto &c : cases) {
    EXPECT_EQ(ErrorLogFileNameForProgram(c.given.c_str()), c.result) << c.given;
  }
}

}  // namespace
