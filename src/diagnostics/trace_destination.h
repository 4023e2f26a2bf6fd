// The formatted-debug-output framework: what can be traced, and where traces go. Nothing in this
// library traces; the classes stand ready for code that does.
#ifndef KVSVAPI_DIAGNOSTICS_TRACE_DESTINATION_H
#define KVSVAPI_DIAGNOSTICS_TRACE_DESTINATION_H

#include <cstddef>

namespace nKVSVAPI100 {

class iTraceable {
 public:
  virtual ~iTraceable() = default;
};

class iTraceDestination {
 public:
  virtual ~iTraceDestination() = default;
  virtual void Write(const char *text) = 0;
  virtual void Write(const char *text, size_t length) = 0;
  virtual void Flush() = 0;
  // Copies the destination's option text into `buffer` (always NUL-terminated when `size` is
  // not 0) and returns the end of what was copied; `neededOut` gets the bytes the whole text needs.
  virtual char *Describe(char *buffer, size_t size, size_t *neededOut) = 0;
  virtual bool IsReady() = 0;
  virtual void Close() = 0;
  virtual const char *Name() = 0;
};

// Type names of a destination's line writer; no operations of their own here.
class ovsdbg_VarLine {};
class ovsdbg_VarLineToBuffer : public ovsdbg_VarLine {};

}  // namespace nKVSVAPI100

#endif
