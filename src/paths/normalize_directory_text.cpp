#include "paths/normalize_directory_text.h"

#include <cctype>

namespace ovsysq {

namespace {

bool IsSpace(char c) { return std::isspace(static_cast<unsigned char>(c)) != 0; }

}  // namespace

void NormalizeDirectoryText(std::string &text) {
  std::size_t end = text.size();
  while (end > 0 && (IsSpace(text[end - 1]) || text[end - 1] == '/' || text[end - 1] == '\0')) {
    --end;
  }
  std::size_t start = 0;
  while (start < end && IsSpace(text[start])) ++start;
  text = text.substr(start, end - start);
}

}  // namespace ovsysq
