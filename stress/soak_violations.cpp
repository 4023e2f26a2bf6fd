#include "soak_violations.h"

#include <atomic>
#include <cstdio>
#include <mutex>

#include "kvsvapi.h"

namespace nKvsvSoak {

namespace {

// Beyond this many the findings are only counted: the first ones say what broke.
constexpr uint64_t kPrinted = 40;

std::atomic<uint64_t> gViolations{0};
std::mutex gPrinting;

}  // namespace

void Violation(const std::string &thread, const std::string &what) {
  if (gViolations.fetch_add(1) >= kPrinted) return;
  std::lock_guard<std::mutex> lock(gPrinting);
  std::fprintf(stderr, "soak: VIOLATION [%s] %s\n", thread.c_str(), what.c_str());
}

uint64_t ViolationCount() { return gViolations.load(); }

std::string StatusText(int32_t status) {
  char text[256] = {};
  kvsvStatusToString(status, sizeof text, text);
  char line[320];
  std::snprintf(line, sizeof line, "0x%08X (%s)", static_cast<uint32_t>(status), text);
  return line;
}

}  // namespace nKvsvSoak
