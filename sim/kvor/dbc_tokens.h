// The words of a CAN database file: identifiers (which may start with a digit), numbers, quoted strings (which may run over
// lines, with \" and \\ escaped) and single punctuation characters, each with its place.
#ifndef KVOR_SIM_DBC_TOKENS_H
#define KVOR_SIM_DBC_TOKENS_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace nKvorSim {

// Thrown by the reading of a file that does not follow the format; `line` counts from 1.
struct tDbcSyntaxError {
  uint32_t line;
  std::string message;
};

struct tDbcToken {
  enum Kind { kEnd, kIdentifier, kNumber, kString, kPunctuation };
  Kind kind = kEnd;
  std::string text;  // a string's text without its quotes and escapes
  uint32_t line = 0;
  uint32_t endLine = 0;  // differs from `line` for a string that runs over lines
  uint32_t column = 0;   // bytes before the token on its line
};

// "identifier 'BO_'", "the end of the text": how an error message names what it found.
std::string DescribeToken(const tDbcToken &token);

class cDbcLexer {
 public:
  explicit cDbcLexer(std::string_view text);

  const tDbcToken &Peek();
  tDbcToken Next();
  // The line on which the token last taken by Next ends; 1 before the first.
  uint32_t LastLine() const { return lastLine_; }

 private:
  tDbcToken Scan();
  void SkipSpace();

  std::string_view text_;
  size_t position_ = 0;
  uint32_t line_ = 1;
  size_t lineStart_ = 0;
  uint32_t lastLine_ = 1;
  tDbcToken peeked_;
  bool hasPeeked_ = false;
};

}  // namespace nKvorSim

#endif
