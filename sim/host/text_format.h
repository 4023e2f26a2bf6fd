// The host's printf dialect: the C directives for integers, characters and C strings, and %H for
// the text of a host string handle.
#ifndef SVHOST_TEXT_FORMAT_H
#define SVHOST_TEXT_FORMAT_H

#include <cstdarg>
#include <string>

namespace svhost {

// Formats into `out`. A directive is %[flags][width][.precision][length]conversion with flags
// from "-0+ #", the conversions d i u x X c s H %, and a length h, l or ll for the integer ones.
// A null C string or string handle formats as "". False on a malformed or unknown directive.
// Throws std::bad_alloc.
bool FormatText(std::string &out, const char *format, va_list arguments);

}  // namespace svhost

#endif
