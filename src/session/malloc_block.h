// Ownership of blocks that come from malloc: driver texts and the project file's records.
#ifndef KVSVAPI_SESSION_MALLOC_BLOCK_H
#define KVSVAPI_SESSION_MALLOC_BLOCK_H

#include <cstdlib>
#include <memory>

namespace nKVSVAPI100 {

struct tFreeBlock {
  void operator()(char *block) const { std::free(block); }
};

using tMallocBlock = std::unique_ptr<char, tFreeBlock>;

}  // namespace nKVSVAPI100

#endif
