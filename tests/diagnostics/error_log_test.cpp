// The log file itself, on logs built over a directory of the test's own: header lines, column
// offsets, the filter options, wrap-around, damaged headers and files that cannot be written.
#include "diagnostics/error_log.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <memory>
#include <regex>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "support/temp_dir.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::ReadFile;
using kvsvtest::WriteAt;

constexpr char kProgram[] = "diagnostics_tests";
constexpr size_t kLine = 128;
const std::vector<std::string> kVersion{"KVOR driver 24.5.0f49"};

// A header line: its text, padded to the line.
std::string Padded(const std::string &s) { return s + std::string(126 - s.size(), ' ') + " \n"; }

class ErrorLogFile : public testing::Test {
 protected:
  std::string Base() const { return dir_.Path() + "/kvorErr.log"; }
  std::string File() const { return dir_.Path() + "/kvorErr_" + kProgram + ".log"; }
  std::string Line(size_t index) const { return ReadFile(File()).substr(index * kLine, kLine); }
  // The text of a column in every row, without its padding, each followed by ','.
  std::string Column(size_t offset, size_t width) const {
    const std::string file = ReadFile(File());
    std::string column;
    for (size_t at = 7 * kLine; at + kLine <= file.size(); at += kLine)
      column +=
          std::regex_replace(file.substr(at + offset, width), std::regex("^ +| +$"), "") + ",";
    return column;
  }
  // The header's counter and the line column of every row.
  std::string Rows() const { return ReadFile(File()).substr(13, 4) + ":" + Column(83, 11); }
  // A report of the internal-error reporter's kind: system service, failed.
  static void WriteError(cErrorLog &log, uint32_t line) {
    log.WriteRow(true, 3, "System Service", 13, 9, line, 0xBFF63001, 0x8009C000 | line);
  }
  // A log made and given `rows`, then edited, then opened again.
  std::unique_ptr<cErrorLog> Edited(uint32_t rows,
                                    const std::vector<std::pair<long, std::string>> &edits) {
    {
      cErrorLog log(kVersion, Base().c_str());
      for (uint32_t i = 1; i <= rows; ++i) WriteError(log, i);
    }
    for (const auto &[offset, text] : edits) WriteAt(File(), offset, text);
    return std::make_unique<cErrorLog>(kVersion, Base().c_str());
  }
  kvsvtest::cTempDir dir_;
};

TEST_F(ErrorLogFile, AFreshFileHasTheHeaderLinesAndEachRowItsColumns) {
  cErrorLog log(kVersion, Base().c_str());
  EXPECT_EQ(log.Path(), File());
  EXPECT_EQ(Line(0), "Current Row: 0000      Max Num Rows: 001000" + std::string(83, ' ') + " \n");
  EXPECT_EQ(Line(1), Padded("(1000) - Log Options: (Internal Errors, User Errors, Internal "
                            "Warnings, User Warnings)"));
  EXPECT_EQ(Line(2), Padded("Date and Time Format YYYY-MM-DD HH:MM:SS (24-hour time)"));
  EXPECT_EQ(Line(3), Padded("KVOR driver 24.5.0f49"));
  EXPECT_EQ(Line(4), Padded(""));
  EXPECT_EQ(Line(5), Padded("Row       Date and Time            Severity      Type           "
                            "Component      File       Line      Code (hex)      Info (hex)"));
  EXPECT_EQ(Line(6), std::string(126, '-') + " \n");

  WriteError(log, 1234);
  std::string row = Line(7);
  EXPECT_TRUE(std::regex_match(row.substr(10, 19),
                               std::regex("\\d{4}-\\d\\d-\\d\\d \\d\\d:\\d\\d:\\d\\d")));
  row.replace(10, 19, "YYYY-MM-DD HH:MM:SS");
  EXPECT_EQ(row,
            "0001      YYYY-MM-DD HH:MM:SS      Error         System Service        13         9"
            "       1234      0xbff63001      0x8009c4d2 \n");
  EXPECT_EQ(Rows(), "0001:1234,");
}

TEST_F(ErrorLogFile, ReportsAreFilteredByTheFourOptionsAndNamedByTheirKind) {
  // Offered in order: an internal error, a user error, an internal warning, a user warning and a
  // system service error, which counts as internal. Anything but '0' switches an option on.
  const std::tuple<const char *, const char *, const char *> cases[] = {
      {"(1000)", "Internal,System Service,", "Error,Error,"},
      {"(0101)", "User,User,", "Error,Warning,"},
      {"(0010)", "Internal,", "Warning,"},
      {"(x0y0)", "Internal,Internal,System Service,", "Error,Warning,Error,"}};
  for (const auto &[options, kinds, severities] : cases) {
    SCOPED_TRACE(options);
    const auto log = Edited(0, {{128, options}});
    // failed | kind << 14 | line 7
    for (uint32_t location : {0x80008007u, 0x80004007u, 0x00008007u, 0x00004007u, 0x8000C007u}) {
      tInternalStatus status;
      status.location = location;
      status.info = 0xBFF63258;
      log->Report(status, 0x3FF63000, 0x7FFFC000);
    }
    EXPECT_EQ(Column(49, 15), kinds);
    EXPECT_EQ(Column(35, 14), severities);
    EXPECT_EQ(ReadFile(File()).substr(128, 6), options) << "the options are kept";
    unlink(File().c_str());
  }
}

TEST_F(ErrorLogFile, HandEditsOfTheHeaderAreTakenOrTheFileIsMadeAfresh) {
  using tEdits = std::vector<std::pair<long, std::string>>;
  // Rows written before the edits, the edits, rows written after, the limit read, and the counter
  // and rows at the end.
  const std::tuple<uint32_t, tEdits, std::vector<uint32_t>, uint32_t, const char *> cases[] = {
      // A limit below the counter: the next row goes to the first place and the table wraps again
      // at the limit; the rows behind it stay.
      {7, {{37, "000005"}}, {100, 101, 102, 103, 104, 105}, 5, "0001:105,101,102,103,104,6,7,"},
      // Without its parentheses the options are not trusted, nor the rest of the file.
      {2, {{37, "000050"}, {128, "X1111"}}, {3}, 1000, "0001:3,"},
      {2, {{37, "000050"}, {133, "]"}}, {3}, 1000, "0001:3,"},
      {2, {{37, "abc"}}, {3}, 1000, "0003:1,2,3,"},  // an unreadable limit falls back to 1000
      {2, {{13, "----"}}, {3}, 1000, "0001:3,2,"}};  // an unreadable counter restarts
  for (const auto &[before, edits, after, limit, rows] : cases) {
    SCOPED_TRACE(rows);
    const auto log = Edited(before, edits);
    EXPECT_EQ(log->MaxRows(), limit);
    for (uint32_t line : after) WriteError(*log, line);
    EXPECT_EQ(Rows(), rows);
    EXPECT_EQ(ReadFile(File()).substr(128, 6), "(1000)");
    unlink(File().c_str());
  }
}

TEST_F(ErrorLogFile, ReopeningKeepsRowsAndRewritesTheVersionLinesUpToAThousand) {
  Edited(1, {});
  cErrorLog log(std::vector<std::string>{"KVOR driver 25.0.0b1"}, Base().c_str());
  EXPECT_EQ(Line(3), Padded("KVOR driver 25.0.0b1"));
  EXPECT_EQ(Rows(), "0001:1,");
  unlink(File().c_str());
  cErrorLog many(std::vector<std::string>(1001, "v"), Base().c_str());
  // A file that went away is made again at the next row.
  unlink(File().c_str());
  WriteError(many, 8);
  EXPECT_EQ(ReadFile(File()).size(), (1000 + 6 + 1) * kLine);
  EXPECT_EQ(Line(1006).substr(0, 4), "0001");
}

TEST_F(ErrorLogFile, ANullNameOrADirectoryThatIsNotThereDropsTheRow) {
  cErrorLog off(kVersion, nullptr);
  EXPECT_STREQ(off.Path(), "");
  WriteError(off, 1);
  const std::string missing = dir_.Path() + "/no/such/dir/kvorErr.log";
  cErrorLog absent(kVersion, missing.c_str());
  WriteError(absent, 1);
  EXPECT_TRUE(std::filesystem::is_empty(dir_.Path()));
}

TEST(ErrorLogName, TheProgramsNameGoesBeforeTheLastDot) {
  const std::string program = std::string("_") + kProgram, x(258 - program.size(), 'x');
  const std::tuple<std::string, std::string> cases[] = {
      {"/a.b/log", "/a" + program + ".b/log"},
      {"/tmp/plain", "/tmp/plain" + program},
      // The longest name that fits the log's path, and one too long.
      {"/" + x, "/" + x + program},
      {"/x" + x, ""}};
  for (const auto &[given, result] : cases)
    EXPECT_EQ(ErrorLogFileNameForProgram(given.c_str()), result) << given;
}

}  // namespace
