// A stand-in for the circular error log: it keeps what the reporter hands it, and its builder can
// be told to fail, to throw or to wait.
#ifndef KVSVAPI_TESTS_FAKE_ERROR_LOG_H
#define KVSVAPI_TESTS_FAKE_ERROR_LOG_H

#include <cstdint>
#include <functional>
#include <mutex>
#include <vector>

#include "core/internal_error.h"

namespace kvsvtest {

struct tLogRecord {
  nKVSVAPI100::tInternalStatus value;
  uint32_t base;
  uint32_t mask;
};

// What the next builds of the log do.
enum class eBuild { kSucceed, kThrowStandard, kThrowOther, kNegativeCode, kPositiveCode };

// Installs itself as the reporter's log for its lifetime; on destruction the real log is the
// reporter's log again (built in a temporary directory of the test program) and is built afresh
// at the next report. One at a time.
class cFakeErrorLog : public nKVSVAPI100::iErrorLog {
 public:
  cFakeErrorLog();
  ~cFakeErrorLog() override;

  nKVSVAPI100::Status Write(nKVSVAPI100::tInternalStatus &value, uint32_t base,
                            uint32_t mask) override;

  void SetBuild(eBuild build);
  // Runs inside each build, before its outcome.
  void SetBuildHook(std::function<void()> hook);
  // False: the accessor finds no log object, although the build succeeded.
  void SetAvailable(bool available);
  void SetWriteThrows(bool throws);

  int Builds() const;
  std::vector<tLogRecord> Records() const;

 private:
  static void Build(nKVSVAPI100::tStatusBlock &block);
  static nKVSVAPI100::iErrorLog *Get();

  mutable std::mutex mutex_;
  eBuild build_ = eBuild::kSucceed;
  std::function<void()> hook_;
  bool available_ = true;
  bool writeThrows_ = false;
  int builds_ = 0;
  std::vector<tLogRecord> records_;
};

}  // namespace kvsvtest

#endif
