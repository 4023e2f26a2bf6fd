// Trace output to the console, through two replaceable function pointers.
#ifndef KVSVAPI_DIAGNOSTICS_CONSOLE_TRACE_DESTINATION_H
#define KVSVAPI_DIAGNOSTICS_CONSOLE_TRACE_DESTINATION_H

#include <cstdarg>
#include <cstddef>
#include <cstdio>

#include "diagnostics/trace_destination.h"

namespace nKVSVAPI100 {

using tTraceFormatter = int (*)(char *buffer, size_t size, const char *format, va_list args);
using tTraceOutput = int (*)(const char *text, std::FILE *stream);

// Writable, so that a host can send the console elsewhere: initially vsnprintf, and fputs to
// standard error.
extern tTraceFormatter gTraceFormatter;
extern tTraceOutput gTraceOutput;

// Longest console output, its NUL included.
constexpr size_t kTraceOutputSize = 512;

class tConsoleTraceDestination : public iTraceDestination {
 public:
  void Write(const char *text) override;
  // Prints at most `length` bytes of `text`.
  void Write(const char *text, size_t length) override;
  void Flush() override;
  char *Describe(char *buffer, size_t size, size_t *neededOut) override;
  bool IsReady() override;
  void Close() override;
  const char *Name() override;
};

}  // namespace nKVSVAPI100

#endif
