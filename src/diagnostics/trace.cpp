#include "diagnostics/trace.h"

#include "diagnostics/console_trace_destination.h"

namespace nKVSVAPI100 {

namespace {

// Defined in this order in one unit, so the destination is built before the trace that uses it.
tConsoleTraceDestination gConsoleDestination;
tTrace gTrace(&gConsoleDestination);

}  // namespace

tTrace &ProcessTrace() { return gTrace; }

iTraceDestination &ConsoleTraceDestination() { return gConsoleDestination; }

}  // namespace nKVSVAPI100
