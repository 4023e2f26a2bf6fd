#include "text_format.h"

#include <climits>
#include <cstdio>
#include <cstring>

#include "counted_text.h"
#include "kvsvapi.h"

namespace svhost {

namespace {

struct Directive {
  std::string flags;
  int width = -1;      // -1: none given.
  int precision = -1;  // -1: none given; "." alone is 0.
  std::string length;
  char conversion = 0;
};

bool IsDigit(char c) { return c >= '0' && c <= '9'; }

// Reads a decimal number no larger than what the C library's printf can honour.
bool ParseNumber(const char *&p, int &value) {
  long long n = 0;
  while (IsDigit(*p)) {
    n = n * 10 + (*p++ - '0');
    if (n > INT_MAX) return false;
  }
  value = static_cast<int>(n);
  return true;
}

// Reads the directive that starts after a '%' and moves `p` past it.
bool ParseDirective(const char *&p, Directive &d) {
  while (*p != '\0' && std::strchr("-0+ #", *p) != nullptr) d.flags += *p++;
  if (IsDigit(*p) && !ParseNumber(p, d.width)) return false;
  if (*p == '.') {
    ++p;
    if (!ParseNumber(p, d.precision)) return false;
  }
  if (*p == 'h' || *p == 'l') {
    d.length += *p++;
    if (*p == 'l' && d.length == "l") d.length += *p++;
  }
  if (*p == '\0' || std::strchr("diuxXcsH%", *p) == nullptr) return false;
  d.conversion = *p++;
  // A length belongs to integers only: "%ls" would read a wide string that nobody passes.
  return d.length.empty() || std::strchr("diuxX", d.conversion) != nullptr;
}

// Applies width and precision to a text argument; '0' does not pad text.
void AppendText(std::string &out, const Directive &d, std::string text) {
  if (d.precision >= 0 && text.size() > static_cast<size_t>(d.precision))
    text.resize(static_cast<size_t>(d.precision));
  const size_t width = d.width < 0 ? 0 : static_cast<size_t>(d.width);
  const std::string pad(width > text.size() ? width - text.size() : 0, ' ');
  const bool left = d.flags.find('-') != std::string::npos;
  out += left ? text + pad : pad + text;
}

// Numbers and characters keep every C rule of flags, width and precision: the C library formats
// them from the directive as it was written.
template <typename T>
bool AppendNumber(std::string &out, const Directive &d, T value) {
  std::string cFormat = "%" + d.flags;
  if (d.width >= 0) cFormat += std::to_string(d.width);
  if (d.precision >= 0) cFormat += "." + std::to_string(d.precision);
  cFormat += d.length;
  cFormat += d.conversion;
  const int length = std::snprintf(nullptr, 0, cFormat.c_str(), value);
  if (length < 0) return false;
  std::string text(static_cast<size_t>(length) + 1, '\0');
  std::snprintf(&text[0], text.size(), cFormat.c_str(), value);
  text.resize(static_cast<size_t>(length));
  out += text;
  return true;
}

bool AppendSigned(std::string &out, const Directive &d, va_list *arguments) {
  if (d.length == "ll") return AppendNumber(out, d, va_arg(*arguments, long long));
  if (d.length == "l") return AppendNumber(out, d, va_arg(*arguments, long));
  return AppendNumber(out, d, va_arg(*arguments, int));
}

bool AppendUnsigned(std::string &out, const Directive &d, va_list *arguments) {
  if (d.length == "ll") return AppendNumber(out, d, va_arg(*arguments, unsigned long long));
  if (d.length == "l") return AppendNumber(out, d, va_arg(*arguments, unsigned long));
  return AppendNumber(out, d, va_arg(*arguments, unsigned int));
}

bool AppendDirective(std::string &out, const Directive &d, va_list *arguments) {
  switch (d.conversion) {
    case '%':
      out += '%';
      return true;
    case 'd':
    case 'i':
      return AppendSigned(out, d, arguments);
    case 'u':
    case 'x':
    case 'X':
      return AppendUnsigned(out, d, arguments);
    case 'c':
      return AppendNumber(out, d, va_arg(*arguments, int));
    case 's': {
      const char *text = va_arg(*arguments, const char *);
      AppendText(out, d, text == nullptr ? std::string() : std::string(text));
      return true;
    }
    case 'H':
      AppendText(out, d, HandleText(va_arg(*arguments, SvHandle), "svStrPrintf"));
      return true;
  }
  return false;
}

}  // namespace

bool FormatText(std::string &out, const char *format, va_list arguments) {
  // A copy of our own, so that helpers can take it by pointer whatever the platform's va_list is.
  va_list own;
  va_copy(own, arguments);
  bool ok = true;
  try {
    for (const char *p = format; ok && *p != '\0';) {
      if (*p != '%') {
        out += *p++;
        continue;
      }
      ++p;
      Directive d;
      ok = ParseDirective(p, d) && AppendDirective(out, d, &own);
    }
  } catch (...) {
    va_end(own);
    throw;
  }
  va_end(own);
  return ok;
}

}  // namespace svhost
