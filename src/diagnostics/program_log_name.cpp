#include <unistd.h>

#include <cstring>
#include <string>

#include "diagnostics/error_log.h"

namespace nKVSVAPI100 {

namespace {

// The last component of the running program's path, if it is plain US-ASCII.
std::string ProgramName() {
  char target[4096];
  const ssize_t length = readlink("/proc/self/exe", target, sizeof target - 1);
  if (length <= 0) return std::string();
  const std::string path(target, static_cast<size_t>(length));
  const std::string name = path.substr(path.find_last_of('/') + 1);
  for (const char c : name) {
    if (static_cast<unsigned char>(c) > 0x7F) return std::string();
  }
  return name;
}

}  // namespace

std::string ErrorLogFileNameForProgram(const char *fileName) {
  std::string name = fileName;
  const std::string program = ProgramName();
  if (!program.empty()) {
    const size_t dot = name.find_last_of('.');
    name.insert(dot == std::string::npos ? name.size() : dot, "_" + program);
  }
  return name.size() + 1 > cErrorLog::kPathSize ? std::string() : name;
}

}  // namespace nKVSVAPI100
