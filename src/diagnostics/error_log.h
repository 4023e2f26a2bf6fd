// The circular error log: fixed 128-byte text lines, a header with the row counter, the row limit
// and four filter options that a person may edit, and rows that wrap at the limit.
#ifndef KVSVAPI_DIAGNOSTICS_ERROR_LOG_H
#define KVSVAPI_DIAGNOSTICS_ERROR_LOG_H

#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

#include <boost/noncopyable.hpp>

#include "core/internal_error.h"
#include "core/internal_status.h"
#include "core/recursive_mutex.h"
#include "core/status.h"
#include "core/status_block.h"

namespace nKVSVAPI100 {

class cErrorLog : public iErrorLog, boost::noncopyable {
 public:
  static constexpr size_t kPathSize = 260;
  static constexpr size_t kLineSize = 128;
  static constexpr uint32_t kDefaultMaxRows = 1000;
  static constexpr size_t kMaxVersionLines = 1000;
  // The header's option order.
  enum eOption { kInternalErrors, kUserErrors, kInternalWarnings, kUserWarnings };

  // Opens (or creates) the log named after `fileName` with this program's name inserted; a null
  // `fileName` makes a log that writes nothing. Lines beyond kMaxVersionLines are dropped.
  cErrorLog(const std::vector<std::string> &versionLines, const char *fileName);
  ~cErrorLog() override;

  // The one process-wide log, built at first use: driver version from the driver, file kvorErr.log
  // in the error-log directory. Throws if the directory cannot be had.
  static cErrorLog *GetErrorLog();

  void Open(const char *fileName);
  // `severity` 1 user, 2 internal (3 counts as 2). Filtered by the header's options; a file that
  // cannot be written drops the row.
  void WriteRow(bool failed, uint32_t severity, const char *kindName, uint32_t component,
                uint32_t file, uint32_t line, uint32_t code, uint32_t info);
  // The public status of `status`; a record for it unless it is empty.
  Status Report(tInternalStatus &status, uint32_t base, uint32_t mask);
  Status Write(tInternalStatus &value, uint32_t base, uint32_t mask) override;

  const tStatusBlock &StatusBlock() const { return status_; }
  const char *Path() const { return path_; }
  uint32_t MaxRows() const { return maxRows_; }
  unsigned char Option(eOption option) const { return options_[option]; }

 private:
  void CreateFile();
  void WriteVersionLines(std::FILE *file) const;
  long RowOffset(uint32_t row) const;

  tStatusBlock status_;
  char path_[kPathSize];
  uint32_t maxRows_ = kDefaultMaxRows;
  unsigned char options_[4] = {1, 0, 0, 0};
  cRecursiveMutex lock_;
  std::vector<std::string> versionLines_;
};

// `fileName` with "_<program>" put before its last dot (or at its end), the program being the
// last component of /proc/self/exe; "" when the result would not fit the log's path field, and
// `fileName` unchanged when the program's name is empty or not US-ASCII.
std::string ErrorLogFileNameForProgram(const char *fileName);

// Makes the process-wide log the reporter's log. Done at load; a stand-in log undoes itself with
// it.
void InstallErrorLog();

// For test programs only: the process-wide log, if not yet built, is to be built in `directory`
// instead of the error-log directory. The library never calls it.
void SetErrorLogDirectoryForTests(const std::string &directory);

}  // namespace nKVSVAPI100

#endif
