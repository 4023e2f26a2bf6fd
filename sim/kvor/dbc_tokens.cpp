#include "dbc_tokens.h"

namespace nKvorSim {

namespace {

bool IsDigit(char c) { return c >= '0' && c <= '9'; }
bool IsIdentifierStart(char c) { return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || c == '_'; }
bool IsIdentifierPart(char c) { return IsIdentifierStart(c) || IsDigit(c); }

}  // namespace

std::string DescribeToken(const tDbcToken &token) {
  switch (token.kind) {
    case tDbcToken::kEnd:
      return "the end of the text";
    case tDbcToken::kIdentifier:
      return "identifier '" + token.text + "'";
    case tDbcToken::kNumber:
      return "number '" + token.text + "'";
    case tDbcToken::kString:
      return "a string";
    default: {
      const unsigned char c = static_cast<unsigned char>(token.text[0]);
      if (c < 0x20 || c >= 0x7F) {
        static const char kHex[] = "0123456789ABCDEF";
        return std::string("byte 0x") + kHex[c >> 4] + kHex[c & 15];
      }
      return "'" + token.text + "'";
    }
  }
}

cDbcLexer::cDbcLexer(std::string_view text) : text_(text) {}

const tDbcToken &cDbcLexer::Peek() {
  if (!hasPeeked_) {
    peeked_ = Scan();
    hasPeeked_ = true;
  }
  return peeked_;
}

tDbcToken cDbcLexer::Next() {
  tDbcToken token = hasPeeked_ ? std::move(peeked_) : Scan();
  hasPeeked_ = false;
  if (token.kind != tDbcToken::kEnd) lastLine_ = token.endLine;
  return token;
}

void cDbcLexer::SkipSpace() {
  while (position_ < text_.size()) {
    const char c = text_[position_];
    if (c == '\n') {
      ++line_;
      lineStart_ = position_ + 1;
    } else if (c != ' ' && c != '\t' && c != '\r' && c != '\f' && c != '\v') {
      return;
    }
    ++position_;
  }
}

tDbcToken cDbcLexer::Scan() {
  SkipSpace();
  tDbcToken token;
  token.line = token.endLine = line_;
  token.column = static_cast<uint32_t>(position_ - lineStart_);
  if (position_ >= text_.size()) return token;

  const size_t start = position_;
  const char c = text_[position_];
  const auto at = [&](size_t i) { return i < text_.size() ? text_[i] : '\0'; };

  if (IsIdentifierStart(c)) {
    while (IsIdentifierPart(at(position_))) ++position_;
    token.kind = tDbcToken::kIdentifier;
  } else if (IsDigit(c) || (c == '.' && IsDigit(at(position_ + 1))) ||
             ((c == '+' || c == '-') &&
              (IsDigit(at(position_ + 1)) || (at(position_ + 1) == '.' && IsDigit(at(position_ + 2)))))) {
    if (c == '+' || c == '-') ++position_;
    while (IsDigit(at(position_))) ++position_;
    if (at(position_) == '.') {
      ++position_;
      while (IsDigit(at(position_))) ++position_;
    }
    const char e = at(position_);
    if (e == 'e' || e == 'E') {
      size_t after = position_ + 1;
      if (at(after) == '+' || at(after) == '-') ++after;
      if (IsDigit(at(after))) {
        position_ = after;
        while (IsDigit(at(position_))) ++position_;
      }
    }
    token.kind = tDbcToken::kNumber;
    // Files of other tools give names that start with a digit ("2ndGear"): digits that run on
    // into a letter or '_' are a name.
    if (IsDigit(c) && IsIdentifierStart(at(position_)) &&
        text_.substr(start, position_ - start).find('.') == std::string_view::npos) {
      while (IsIdentifierPart(at(position_))) ++position_;
      token.kind = tDbcToken::kIdentifier;
    }
  } else if (c == '"') {
    ++position_;
    std::string value;
    for (;;) {
      if (position_ >= text_.size()) {
        throw tDbcSyntaxError{token.line, "the string that starts here has no closing quote"};
      }
      const char s = text_[position_++];
      if (s == '"') break;
      if (s == '\\' && (at(position_) == '"' || at(position_) == '\\')) {
        value += text_[position_++];
        continue;
      }
      if (s == '\n') {
        ++line_;
        lineStart_ = position_;
      }
      value += s;
    }
    token.kind = tDbcToken::kString;
    token.text = std::move(value);
    token.endLine = line_;
    return token;
  } else {
    ++position_;
    token.kind = tDbcToken::kPunctuation;
  }
  token.text.assign(text_.substr(start, position_ - start));
  return token;
}

}  // namespace nKvorSim
