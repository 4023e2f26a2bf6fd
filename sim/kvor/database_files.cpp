#include "database_files.h"

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <sys/stat.h>

#include "dbc_reader.h"
#include "dbc_writer.h"
#include "kvsim.h"

namespace nKvorSim {

std::string DatabasePath(std::string_view name) {
  if (!name.empty() && name.front() == '/') return std::string(name);
  const char *directory = std::getenv(kDatabaseDirVariable);
  if (directory == nullptr || *directory == '\0') return std::string(name);
  std::string path = directory;
  if (path.back() != '/') path += '/';
  return path.append(name);
}

std::string CanonicalPath(const std::string &path) {
  char *resolved = realpath(path.c_str(), nullptr);
  if (resolved == nullptr) return {};
  std::string canonical = resolved;
  std::free(resolved);
  struct stat info;
  if (stat(canonical.c_str(), &info) != 0 || !S_ISREG(info.st_mode)) return {};
  return canonical;
}

Status LoadDatabaseFile(const std::string &path, std::string_view shownName, tDatabase *database,
                        std::string *error) {
  std::ifstream file(path, std::ios::binary);
  if (!file) {
    *error = std::string(shownName) + ": the file cannot be read";
    return kvsimErrDatabaseNotFound;
  }
  const std::string text{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
  if (file.bad()) {
    *error = std::string(shownName) + ": the file cannot be read";
    return kvsimErrDatabaseNotFound;
  }
  tDbcError failure;
  std::vector<tDbcError> warnings;
  if (!ReadDbc(text, database, &failure, &warnings)) {
    *error = std::string(shownName) + ", line " + std::to_string(failure.line) + ": " +
             failure.message;
    return kvsimErrDatabaseSyntax;
  }
  error->clear();
  for (const tDbcError &warning : warnings) {
    *error += (error->empty() ? "" : "; ") + std::string(shownName) + ", line " +
              std::to_string(warning.line) + ": warning: " + warning.message;
  }
  return 0;
}

Status SaveDatabaseFile(const tDatabase &database, const std::string &path, std::string *error) {
  std::string text;
  if (!WriteDbc(database, &text, error)) return kvsimErrDatabaseWrite;
  // Written beside the file and renamed over it, so that a failed save leaves the file as it was.
  const std::string temporary = path + ".kvsim-saving";
  std::ofstream file(temporary, std::ios::binary | std::ios::trunc);
  if (file) file.write(text.data(), static_cast<std::streamsize>(text.size()));
  if (file) file.close();
  if (!file || std::rename(temporary.c_str(), path.c_str()) != 0) {
    std::remove(temporary.c_str());
    *error = path + ": the file cannot be written";
    return kvsimErrDatabaseWrite;
  }
  return 0;
}

}  // namespace nKvorSim
