#include "diagnostics/error_log.h"

#include <atomic>
#include <cstring>
#include <ctime>
#include <mutex>

#include "core/public_status.h"
#include "diagnostics/driver_version.h"
#include "paths/directory_kind.h"
#include "paths/path_maker.h"

namespace nKVSVAPI100 {

namespace {

constexpr int kContentWidth = 126;
constexpr char kLineEnd[] = " \n";
constexpr long kCurrentRowOffset = 13;
constexpr long kMaxRowsOffset = 37;
constexpr long kOptionsOffset = 128;
constexpr long kVersionOffset = 384;
// Header lines besides the version lines: counter, options, date format, blank, heading, hyphens.
constexpr long kFixedHeaderLines = 6;
constexpr char kFallbackName[] = "LogFile.txt";
constexpr size_t kKindNameWidth = 15;

constexpr char kOptionsText[] =
    " - Log Options: (Internal Errors, User Errors, Internal Warnings, User Warnings)";
constexpr char kDateFormatText[] = "Date and Time Format YYYY-MM-DD HH:MM:SS (24-hour time)";

// Widths of the nine columns; they add up to the content width.
constexpr int kRowWidth = 10;
constexpr int kDateWidth = 25;
constexpr int kSeverityWidth = 14;
constexpr int kTypeWidth = 15;
constexpr int kComponentWidth = 9;
constexpr int kFileWidth = 10;
constexpr int kLineWidth = 11;
constexpr int kCodeWidth = 16;
constexpr int kInfoWidth = 16;
static_assert(kRowWidth + kDateWidth + kSeverityWidth + kTypeWidth + kComponentWidth + kFileWidth +
                      kLineWidth + kCodeWidth + kInfoWidth ==
                  kContentWidth,
              "columns fill the line");

// A hex column: six blanks, then 0x and eight digits.
constexpr char kHexPad[] = "      ";

bool ReadInt(std::FILE *file, long offset, int &value) {
  return std::fseek(file, offset, SEEK_SET) == 0 && std::fscanf(file, "%d", &value) == 1;
}

}  // namespace

cErrorLog::cErrorLog(const std::vector<std::string> &versionLines, const char *fileName)
    : lock_(status_),
      versionLines_(versionLines.begin(),
                    versionLines.size() > kMaxVersionLines
                        ? versionLines.begin() + static_cast<std::ptrdiff_t>(kMaxVersionLines)
                        : versionLines.end()) {
  path_[0] = '\0';
  Open(fileName);
}

cErrorLog::~cErrorLog() = default;

long cErrorLog::RowOffset(uint32_t row) const {
  return (static_cast<long>(versionLines_.size()) + kFixedHeaderLines + static_cast<long>(row)) *
         static_cast<long>(kLineSize);
}

void cErrorLog::Open(const char *fileName) {
  std::lock_guard<cRecursiveMutex> guard(lock_);
  if (fileName == nullptr) {
    path_[0] = '\0';
    return;
  }
  std::string name = ErrorLogFileNameForProgram(fileName);
  if (name.empty()) name = kFallbackName;
  std::memcpy(path_, name.c_str(), name.size() + 1);

  std::FILE *file = std::fopen(path_, "r+");
  if (file != nullptr) {
    int maxRows = 0;
    maxRows_ = ReadInt(file, kMaxRowsOffset, maxRows) ? static_cast<uint32_t>(maxRows)
                                                      : kDefaultMaxRows;
    char options[6];
    const bool wellFormed =
        std::fseek(file, kOptionsOffset, SEEK_SET) == 0 &&
        std::fscanf(file, "%c%c%c%c%c%c", &options[0], &options[1], &options[2], &options[3],
                    &options[4], &options[5]) == 6 &&
        options[0] == '(' && options[5] == ')';
    WriteVersionLines(file);
    std::fclose(file);
    if (wellFormed) {
      for (int i = 0; i < 4; ++i) options_[i] = options[i + 1] == '0' ? 0 : 1;
      return;
    }
  }
  CreateFile();
}

void cErrorLog::WriteVersionLines(std::FILE *file) const {
  if (std::fseek(file, kVersionOffset, SEEK_SET) != 0) return;
  for (const std::string &line : versionLines_) {
    std::fprintf(file, "%-*.*s%s", kContentWidth, kContentWidth, line.c_str(), kLineEnd);
  }
}

// A new file holds the header only; only internal errors are logged until somebody edits it.
void cErrorLog::CreateFile() {
  maxRows_ = kDefaultMaxRows;
  options_[kInternalErrors] = 1;
  options_[kUserErrors] = 0;
  options_[kInternalWarnings] = 0;
  options_[kUserWarnings] = 0;
  std::FILE *file = std::fopen(path_, "w");
  if (file == nullptr) return;
  std::fprintf(file, "Current Row: %.4d      Max Num Rows: %-*.6d%s", 0, 89,
               static_cast<int>(maxRows_), kLineEnd);
  std::fprintf(file, "(%d%d%d%d)%-*s%s", options_[0], options_[1], options_[2], options_[3], 120,
               kOptionsText, kLineEnd);
  std::fprintf(file, "%-*s%s", kContentWidth, kDateFormatText, kLineEnd);
  WriteVersionLines(file);
  std::fprintf(file, "%*s%s", kContentWidth, "", kLineEnd);
  std::fprintf(file, "%-*s%-*s%-*s%-*s%*s%*s%*s%*s%*s%s", kRowWidth, "Row", kDateWidth,
               "Date and Time", kSeverityWidth, "Severity", kTypeWidth, "Type", kComponentWidth,
               "Component", kFileWidth, "File", kLineWidth, "Line", kCodeWidth, "Code (hex)",
               kInfoWidth, "Info (hex)", kLineEnd);
  const std::string hyphens(120, '-');
  std::fprintf(file, "%s%s", (hyphens + "------").c_str(), kLineEnd);
  std::fclose(file);
}

void cErrorLog::WriteRow(bool failed, uint32_t severity, const char *kindName, uint32_t component,
                         uint32_t file, uint32_t line, uint32_t code, uint32_t info) {
  if (severity == 3) severity = 2;
  const bool wanted = (severity == 2 && failed && options_[kInternalErrors]) ||
                      (severity == 1 && failed && options_[kUserErrors]) ||
                      (severity == 2 && !failed && options_[kInternalWarnings]) ||
                      (severity == 1 && !failed && options_[kUserWarnings]);
  if (!wanted) return;

  std::lock_guard<cRecursiveMutex> guard(lock_);
  if (path_[0] == '\0') return;
  std::FILE *out = std::fopen(path_, "r+");
  if (out == nullptr) {
    CreateFile();
    out = std::fopen(path_, "r+");
    if (out == nullptr) return;
  }
  int counter = 0;
  // A counter that cannot be read, or a negative one, starts the table again.
  uint32_t current = ReadInt(out, kCurrentRowOffset, counter) ? static_cast<uint32_t>(counter) : 0;
  if (current >= maxRows_) current = 0;
  if (std::fseek(out, RowOffset(current), SEEK_SET) == 0) {
    ++current;
    char date[20];
    std::memset(date, 0, sizeof date);
    const std::time_t now = std::time(nullptr);
    std::tm local;
    if (localtime_r(&now, &local) != nullptr) {
      std::strftime(date, sizeof date, "%Y-%m-%d %H:%M:%S", &local);
    }
    const bool printable = kindName != nullptr && std::strlen(kindName) <= kKindNameWidth;
    std::fprintf(out, "%-*.4d%-*s%-*s%-*s%*u%*u%*u%s0x%08x%s0x%08x%s", kRowWidth,
                 static_cast<int>(current), kDateWidth, date, kSeverityWidth,
                 failed ? "Error" : "Warning", kTypeWidth, printable ? kindName : "????????",
                 kComponentWidth, component, kFileWidth, file, kLineWidth, line, kHexPad, code,
                 kHexPad, info, kLineEnd);
    if (std::fseek(out, kCurrentRowOffset, SEEK_SET) == 0) {
      std::fprintf(out, "%.4d", static_cast<int>(current));
    }
  }
  std::fclose(out);
}

Status cErrorLog::Report(tInternalStatus &status, uint32_t base, uint32_t mask) {
  const Status result = ToPublicStatus(status, base, mask);
  const uint32_t kind = status.Kind();
  if (kind == tInternalStatus::kEmpty) return result;
  WriteRow(status.Failed(), KindSeverity(kind), KindName(kind), status.Component(), status.File(),
           status.Line(), status.info, status.location);
  return result;
}

Status cErrorLog::Write(tInternalStatus &value, uint32_t base, uint32_t mask) {
  return Report(value, base, mask);
}

}  // namespace nKVSVAPI100

// ---- The process-wide log and its place in the reporter.

namespace nKVSVAPI100 {

namespace {

constexpr char kLogFileName[] = "kvorErr.log";

// The reporter reaches the instance only once its build has succeeded, and no longer once it is
// gone at exit.
std::atomic<cErrorLog *> gInstalledLog{nullptr};

std::mutex gTestDirectoryLock;

// Built at first use: a test program may set it from its own static initialisers.
std::string &TestDirectory() {
  static std::string directory;
  return directory;
}

std::string LogDirectory() {
  {
    std::lock_guard<std::mutex> lock(gTestDirectoryLock);
    if (!TestDirectory().empty()) return TestDirectory();
  }
  return kvpath::cSvCgSupportLibraryPathMaker::MakePath(kvpath::eErrorLogDir)->GetMultibyte();
}

struct tProcessLog {
  tProcessLog()
      : log(std::vector<std::string>{DriverVersionLine()},
            (LogDirectory() + "/" + kLogFileName).c_str()) {}
  ~tProcessLog() { gInstalledLog.store(nullptr); }
  cErrorLog log;
};

void BuildProcessLog(tStatusBlock &block) {
  cErrorLog *log = cErrorLog::GetErrorLog();
  const tStatusBlock &built = log->StatusBlock();
  if (built.code != 0) {
    SetStatusBlock(block, built.code, built.component, built.file, built.line);
  }
  gInstalledLog.store(log);
}

iErrorLog *ProcessLog() { return gInstalledLog.load(); }

struct tInstallAtLoad {
  tInstallAtLoad() { InstallErrorLog(); }
} gInstallAtLoad;

}  // namespace

cErrorLog *cErrorLog::GetErrorLog() {
  static tProcessLog instance;
  return &instance.log;
}

void InstallErrorLog() { SetErrorLogProvider(&BuildProcessLog, &ProcessLog); }

void SetErrorLogDirectoryForTests(const std::string &directory) {
  std::lock_guard<std::mutex> lock(gTestDirectoryLock);
  TestDirectory() = directory;
}

}  // namespace nKVSVAPI100
