#include "core/status_block.h"

#include <cstring>

namespace nKVSVAPI100 {

namespace {

constexpr uint64_t kBlockSize = 216;
constexpr size_t kComponentChars = sizeof(tStatusBlock::component) - 1;
constexpr size_t kFileChars = sizeof(tStatusBlock::file) - 1;
// A long path keeps its start (the tree) and its end (the file name) around "..".
constexpr size_t kFileKeep = 49;

void StoreComponent(char (&target)[10], const char *component) {
  const size_t length = strnlen(component, kComponentChars);
  std::memcpy(target, component, length);
  target[length] = '\0';
}

void StoreFile(char (&target)[101], const char *file) {
  const size_t length = std::strlen(file);
  if (length <= kFileChars) {
    std::memcpy(target, file, length + 1);
    return;
  }
  std::memcpy(target, file, kFileKeep);
  std::memcpy(target + kFileKeep, "..", 2);
  std::memcpy(target + kFileKeep + 2, file + length - kFileKeep, kFileKeep);
  target[kFileKeep * 2 + 2] = '\0';
}

}  // namespace

tStatusBlock::tStatusBlock() : size(kBlockSize), code(0), line(0), detail(0) {
  component[0] = '\0';
  file[0] = '\0';
}

bool SetStatusBlock(tStatusBlock &block, int64_t code, const char *component, const char *file,
                    uint64_t line) {
  if (code == 0 || block.code < 0) return false;
  if (block.code > 0 && code > 0) return false;
  block.code = code;
  if (block.size >= kBlockSize) {
    StoreComponent(block.component, component != nullptr ? component : "");
    StoreFile(block.file, file != nullptr ? file : "");
    block.line = line;
  }
  return true;
}

}  // namespace nKVSVAPI100
