#include "diagnostics/console_trace_destination.h"

#include <cstring>

namespace nKVSVAPI100 {

namespace {

constexpr char kDestinationOption[] = " --destination apal";

__attribute__((format(printf, 1, 2))) void Print(const char *format, ...) {
  char text[kTraceOutputSize];
  va_list args;
  va_start(args, format);
  gTraceFormatter(text, sizeof text, format, args);
  va_end(args);
  text[sizeof text - 1] = '\0';
  gTraceOutput(text, stderr);
}

}  // namespace

tTraceFormatter gTraceFormatter = &std::vsnprintf;
tTraceOutput gTraceOutput = &std::fputs;

void tConsoleTraceDestination::Write(const char *text) { Print("%s", text); }

void tConsoleTraceDestination::Write(const char *text, size_t length) {
  char format[32];
  std::snprintf(format, sizeof format, "%%.%zus", length);
  Print(format, text);
}

void tConsoleTraceDestination::Flush() {}

char *tConsoleTraceDestination::Describe(char *buffer, size_t size, size_t *neededOut) {
  const size_t needed = sizeof kDestinationOption;
  if (neededOut != nullptr) *neededOut = needed;
  if (buffer == nullptr || size == 0) return buffer;
  const size_t copied = needed <= size ? needed - 1 : size - 1;
  std::memcpy(buffer, kDestinationOption, copied);
  buffer[copied] = '\0';
  return buffer + copied;
}

bool tConsoleTraceDestination::IsReady() { return true; }

void tConsoleTraceDestination::Close() {}

const char *tConsoleTraceDestination::Name() { return "ovsdbg_printf"; }

}  // namespace nKVSVAPI100
