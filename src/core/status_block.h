// The status block that every global object whose construction can fail carries.
#ifndef KVSVAPI_CORE_STATUS_BLOCK_H
#define KVSVAPI_CORE_STATUS_BLOCK_H

#include <cstddef>
#include <cstdint>

namespace nKVSVAPI100 {

struct tStatusBlock {
  uint64_t size;        // capacity of the block: always 216
  int64_t code;         // 0 or a status; negative means failed
  char component[10];   // "kvsvapi", cut to 9 and NUL-terminated
  char file[101];       // source path; over 100 characters: first 49, "..", last 49
  uint64_t line;
  uint64_t detail;      // always 0
  unsigned char reserved[72];

  tStatusBlock();
};

static_assert(sizeof(tStatusBlock) == 216, "status block layout");
static_assert(offsetof(tStatusBlock, code) == 8, "status block layout");
static_assert(offsetof(tStatusBlock, component) == 16, "status block layout");
static_assert(offsetof(tStatusBlock, file) == 26, "status block layout");
static_assert(offsetof(tStatusBlock, line) == 128, "status block layout");
static_assert(offsetof(tStatusBlock, detail) == 136, "status block layout");

// Stores `code` by the worst-of rule: a negative code stays; a positive one gives way only to a
// negative one; 0 takes anything non-zero; a zero code changes nothing. Returns true if stored.
bool SetStatusBlock(tStatusBlock &block, int64_t code, const char *component, const char *file,
                    uint64_t line);

}  // namespace nKVSVAPI100

#endif
