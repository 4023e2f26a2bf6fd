#include "session/session_file_entry.h"

#include <cstring>

#include "kvsvapi.h"
#include "session/session_file_fields.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint32_t kRewindLine = 399;
constexpr uint32_t kNumbersLine = 421;
constexpr uint32_t kListLine = 442;
constexpr uint32_t kClusterLine = 451;
constexpr uint32_t kDatabaseLine = 469;

bool NameLineMatches(const char *line, const char *name) {
  if (name == nullptr || *name == '\0') return true;
  return std::strncmp(line, name, std::strlen(name)) == 0;
}

bool EndsInLineFeed(const char *line) {
  const size_t length = std::strlen(line);
  return length != 0 && line[length - 1] == '\n';
}

// Leaves the file at the start of the second line of the entry of `name`. False at the end of
// the file.
bool FindEntry(FILE *file, const char *name) {
  char line[kSessionFileLineBuffer];
  for (uint64_t index = 0; std::fgets(line, sizeof line, file) != nullptr; ++index) {
    if (index % 3 == 0) {
      if (NameLineMatches(line, name)) return true;
    } else if (!EndsInLineFeed(line)) {
      SkipRestOfLine(file);
    }
  }
  return false;
}

// Fills `block` of `size` bytes with the four texts of the line at the file's position.
Status ReadFields(FILE *file, char *block, size_t size, tSessionEntry &entry) {
  char *field = block;
  char *const end = block + size;
  const auto next = [&] {
    DashMeansEmpty(field);
    field += std::strlen(field) + 1;
  };
  tEntryNumbers numbers;
  if (!ReadNumbersAndToken(file, numbers, field, size)) return ReportMalformedEntry(kNumbersLine);
  entry.mode = numbers.mode;
  entry.resampleRate = numbers.ResampleRate();
  entry.extra = numbers.extra;
  next();
  if (!ReadToken(file, field, static_cast<size_t>(end - field)))
    return ReportMalformedEntry(kListLine);
  next();
  if (!ReadToken(file, field, static_cast<size_t>(end - field)))
    return ReportMalformedEntry(kClusterLine);
  next();
  if (!ReadDatabaseField(file, field, static_cast<size_t>(end - field)))
    return ReportMalformedEntry(kDatabaseLine);
  return 0;
}

}  // namespace

const char *tSessionEntry::Field(size_t index) const {
  const char *field = text.get();
  for (size_t i = 0; i < index; ++i) field += std::strlen(field) + 1;
  return field;
}

Status ReadSessionEntry(const char *name, const char *path, tSessionEntry &entry) {
  entry.text.reset();
  cSessionFileStream stream(path);
  if (!stream.IsOpen() || !FindEntry(stream.Get(), name)) return kvErrSessionFile;
  const long count = CountLineAhead(stream.Get());
  if (count < 0) return ReportMalformedEntry(kRewindLine);
  const size_t size = static_cast<size_t>(count) + 1;
  tMallocBlock block(static_cast<char *>(std::malloc(size)));
  if (!block) return kvErrOutOfMemory;
  const Status status = ReadFields(stream.Get(), block.get(), size, entry);
  if (status < 0) return status;
  entry.text = std::move(block);
  return 0;
}

}  // namespace nKVSVAPI100
