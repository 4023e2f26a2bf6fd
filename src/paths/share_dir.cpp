#include "paths/share_dir.h"

#include <cerrno>
#include <cstdio>
#include <vector>

#include "paths/normalize_directory_text.h"
#include "paths/ovsysq_status.h"

namespace ovsysq {

const char kShareDirFile[] = "/etc/orvane/share/share.dir";
const char kShareDirDefault[] = "/usr/local/orvane/share";

namespace {

constexpr long kMaxShareDirFileSize = 1 << 20;

// The whole file as bytes; a failure goes to `status` with its detail.
std::string ReadWholeFile(const char *fileName, tJsonStatus &status) {
  std::FILE *file = std::fopen(fileName, "rb");
  if (file == nullptr) {
    char *cursor = SetOsFault(status, kResourceNotFound, __FILE__, __LINE__, errno,
                              "error opening file");
    jsonz::AddString(cursor, "filename", fileName, RetryFor(status));
    return std::string();
  }
  std::fseek(file, 0, SEEK_END);
  const long size = std::ftell(file);
  std::fseek(file, 0, SEEK_SET);
  // A size that can't be told, or that no directory text could have (a directory reports an
  // end far beyond its content), reads as a short read of nothing rather than a huge buffer.
  const bool plausible = size >= 0 && size <= kMaxShareDirFileSize;
  const std::size_t fileSize = plausible ? static_cast<std::size_t>(size) : 0;
  std::vector<char> bytes(fileSize);
  const std::size_t got = std::fread(bytes.data(), 1, fileSize, file);
  const int err = errno;
  std::fclose(file);
  if (got != fileSize || !plausible) {
    const jsonz::tRetry retry = RetryFor(status);
    char *cursor = SetOsFault(status, kOsFault, __FILE__, __LINE__, err,
                              "didn't read full content of file");
    cursor = jsonz::AddString(cursor, "filename", fileName, retry);
    cursor = jsonz::AddUint64(cursor, "fileSize", static_cast<uint64_t>(size), retry);
    jsonz::AddUint64(cursor, "fread_return", got, retry);
    return std::string();
  }
  return std::string(bytes.begin(), bytes.end());
}

}  // namespace

std::string ReadShareDir(const char *fileName) {
  tJsonStatus local;
  std::string text = ReadWholeFile(fileName, local);
  const bool failed = local.code < 0;
  nKVSVAPI100::ReleaseJsonStatus(local);
  if (failed) return kShareDirDefault;
  NormalizeDirectoryText(text);
  return text;
}

}  // namespace ovsysq
