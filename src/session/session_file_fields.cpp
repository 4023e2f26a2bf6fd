#include "session/session_file_fields.h"

#include <cstring>

#include "core/internal_error.h"

namespace nKVSVAPI100 {

namespace {

// "%s" with a width that keeps the token and its NUL within `room`. False if not even one
// character fits.
bool TokenFormat(const char *numbers, size_t room, char (&format)[32]) {
  if (room < 2) return false;
  const int written = std::snprintf(format, sizeof format, "%s%%%zus", numbers, room - 1);
  return written > 0 && static_cast<size_t>(written) < sizeof format;
}

bool IsBlank(int c) { return c == ' ' || c == '\t'; }

}  // namespace

cSessionFileStream::cSessionFileStream(const char *path)
    : file_(path != nullptr ? std::fopen(path, "r") : nullptr) {}

cSessionFileStream::~cSessionFileStream() {
  if (file_ != nullptr) std::fclose(file_);
}

Status ReportMalformedEntry(uint32_t line) {
  return ReportInternalError(kComponentKvsvapi, nFile::kSessionFile, line, 0);
}

long CountLineAhead(FILE *file) {
  fpos_t start;
  if (std::fgetpos(file, &start) != 0) return -1;
  long count = 0;
  for (int c = std::fgetc(file); c != EOF; c = std::fgetc(file)) {
    ++count;
    if (c == '\n') break;
  }
  if (std::fsetpos(file, &start) != 0) return -1;
  return count;
}

void SkipRestOfLine(FILE *file) {
  for (int c = std::fgetc(file); c != EOF && c != '\n'; c = std::fgetc(file)) {
  }
}

bool ReadNumbersAndToken(FILE *file, tEntryNumbers &numbers, char *token, size_t room) {
  char format[32];
  if (!TokenFormat("%d %d %d %d ", room, format)) return false;
  return std::fscanf(file, format, &numbers.mode, &numbers.rateWhole, &numbers.rateMicro,
                     &numbers.extra, token) == 5;
}

bool ReadToken(FILE *file, char *token, size_t room) {
  char format[32];
  if (!TokenFormat("", room, format)) return false;
  return std::fscanf(file, format, token) == 1;
}

bool ReadDatabaseField(FILE *file, char *field, size_t room) {
  if (room < 2) return false;
  const int first = std::fgetc(file);
  if (first == EOF) return false;
  char *rest = field;
  // Without a separating blank the character read belongs to the database already.
  if (!IsBlank(first)) *rest++ = static_cast<char>(first);
  if (std::fgets(rest, static_cast<int>(room - static_cast<size_t>(rest - field)), file) ==
      nullptr)
    return false;
  if (field[0] == '-') {
    field[0] = '\0';
    return true;
  }
  size_t length = std::strlen(field);
  if (length != 0) field[--length] = '\0';
  if (length != 0 && field[length - 1] == '\r') field[length - 1] = '\0';
  return true;
}

void DashMeansEmpty(char *field) {
  if (field[0] == '-') field[0] = '\0';
}

size_t InterfaceKeyLength(const char *interfaceName) {
  const char *slash = std::strrchr(interfaceName, '/');
  return slash != nullptr ? static_cast<size_t>(slash - interfaceName)
                          : std::strlen(interfaceName);
}

}  // namespace nKVSVAPI100
