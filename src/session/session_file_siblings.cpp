#include "session/session_file_siblings.h"

#include <cstring>
#include <new>
#include <string>

#include "kvsvapi.h"
#include "session/session_file_fields.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint32_t kRewindLine = 562;
constexpr uint32_t kNumbersLine = 590;

// The name line without its last character, which is the line feed unless the line was cut,
// and without a carriage return before it.
size_t TrimNameLine(char *line) {
  size_t length = std::strlen(line);
  if (length != 0) line[--length] = '\0';
  if (length != 0 && line[length - 1] == '\r') line[--length] = '\0';
  return length;
}

class cSiblingScan {
 public:
  cSiblingScan(const char *interfaceKey, const char *database, const char *cluster)
      : interfaceKey_(interfaceKey), database_(database), cluster_(cluster) {}

  // Appends each sibling to `list`; the status of the first entry that could not be read.
  Status Scan(FILE *file, std::string &list) {
    char name[kSessionFileLineBuffer];
    while (std::fgets(name, sizeof name, file) != nullptr) {
      const size_t nameLength = TrimNameLine(name);
      const long count = CountLineAhead(file);
      if (count < 0) return ReportMalformedEntry(kRewindLine);
      if (!Reserve(static_cast<size_t>(count) + 1)) return kvErrOutOfMemory;
      const int matched = Matches(file);
      if (matched < 0) return ReportMalformedEntry(kNumbersLine);
      // The third line of the entry is not read.
      SkipRestOfLine(file);
      // A session without a name cannot be opened, and would end the list early.
      if (matched == 1 && nameLength != 0) list.append(name, nameLength + 1);
    }
    return 0;
  }

 private:
  bool Reserve(size_t size) {
    if (size <= workSize_) return true;
    work_.reset(static_cast<char *>(std::malloc(size)));
    workSize_ = work_ ? size : 0;
    return work_ != nullptr;
  }

  // Reads the second line of an entry: 1 for a sibling, 0 for another session, -1 if its
  // numbers and interface cannot be read.
  int Matches(FILE *file) {
    char *token = work_.get();
    tEntryNumbers numbers;
    if (!ReadNumbersAndToken(file, numbers, token, workSize_)) return -1;
    token[InterfaceKeyLength(token)] = '\0';
    bool same = std::strcmp(token, interfaceKey_) == 0;
    // The list is read past, then the cluster and the database compared.
    if (!ReadToken(file, token, workSize_) || !ReadToken(file, token, workSize_)) return 0;
    DashMeansEmpty(token);
    same = same && std::strcmp(token, cluster_) == 0;
    if (!ReadDatabaseField(file, token, workSize_)) return 0;
    return same && std::strcmp(token, database_) == 0 ? 1 : 0;
  }

  const char *interfaceKey_;
  const char *database_;
  const char *cluster_;
  tMallocBlock work_;
  size_t workSize_ = 0;
};

}  // namespace

Status ListSiblingSessions(const char *interfaceKey, const char *database, const char *cluster,
                           const char *path, tMallocBlock &names) {
  names.reset();
  cSessionFileStream stream(path);
  if (!stream.IsOpen()) return kvErrSessionFile;
  std::string list;
  Status status = 0;
  try {
    status = cSiblingScan(interfaceKey, database, cluster).Scan(stream.Get(), list);
  } catch (const std::bad_alloc &) {
    status = kvErrOutOfMemory;
  }
  if (status < 0) return status;
  // The closing NUL; an empty list is that alone.
  tMallocBlock block(static_cast<char *>(std::malloc(list.size() + 1)));
  if (!block) return kvErrOutOfMemory;
  std::memcpy(block.get(), list.data(), list.size());
  block.get()[list.size()] = '\0';
  names = std::move(block);
  return 0;
}

}  // namespace nKVSVAPI100
