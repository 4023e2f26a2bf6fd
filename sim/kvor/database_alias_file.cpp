#include "database_alias_file.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sys/stat.h>

namespace nKvorSim {

namespace {

std::string WithoutTrailingSlashes(std::string path) {
  while (!path.empty() && path.back() == '/') path.pop_back();
  return path;
}

std::string Directory() {
  const char *own = std::getenv(kConfigDirVariable);
  if (own != nullptr && *own != '\0') return WithoutTrailingSlashes(own);
  const char *xdg = std::getenv("XDG_CONFIG_HOME");
  if (xdg != nullptr && *xdg != '\0') return WithoutTrailingSlashes(xdg) + "/kvor";
  const char *home = std::getenv("HOME");
  if (home != nullptr && *home != '\0') return WithoutTrailingSlashes(home) + "/.config/kvor";
  return {};
}

// Makes the directory and its missing parents.
bool MakeDirectories(const std::string &path) {
  if (path.empty()) return true;
  struct stat info;
  if (stat(path.c_str(), &info) == 0) return S_ISDIR(info.st_mode);
  const size_t slash = path.rfind('/');
  if (slash != std::string::npos && slash != 0 && !MakeDirectories(path.substr(0, slash))) {
    return false;
  }
  return mkdir(path.c_str(), 0700) == 0 || errno == EEXIST;
}

}  // namespace

std::string AliasFilePath() {
  const std::string directory = Directory();
  return directory.empty() ? directory : directory + "/" + kAliasFileName;
}

DatabaseAliases ReadAliasFile() {
  DatabaseAliases aliases;
  const std::string path = AliasFilePath();
  if (path.empty()) return aliases;
  std::ifstream file(path);
  for (std::string line; std::getline(file, line);) {
    const size_t first = line.find('\t');
    const size_t second = first == std::string::npos ? first : line.find('\t', first + 1);
    if (second == std::string::npos || first == 0) continue;
    char *end = nullptr;
    const std::string rate = line.substr(first + 1, second - first - 1);
    const unsigned long long baudRate = std::strtoull(rate.c_str(), &end, 10);
    if (rate.empty() || *end != '\0') continue;
    aliases.Add(line.substr(0, first), tAlias{line.substr(second + 1), baudRate});
  }
  return aliases;
}

bool WriteAliasFile(const DatabaseAliases &aliases, std::string *error) {
  const std::string path = AliasFilePath();
  if (path.empty()) {
    *error = "no configuration directory for the alias file: neither HOME nor " +
             std::string(kConfigDirVariable) + " is set";
    return false;
  }
  if (!MakeDirectories(Directory())) {
    *error = Directory() + ": the directory of the alias file cannot be made";
    return false;
  }
  const std::string temporary = path + ".kvsim-saving";
  std::ofstream file(temporary, std::ios::trunc);
  aliases.ForEach([&](const std::string &alias, const tAlias &target) {
    file << alias << '\t' << target.baudRate << '\t' << target.path << '\n';
  });
  if (file) file.close();
  if (!file || std::rename(temporary.c_str(), path.c_str()) != 0) {
    std::remove(temporary.c_str());
    *error = path + ": the alias file cannot be written";
    return false;
  }
  return true;
}

}  // namespace nKvorSim
