#include "fatal.h"

#include <cstdio>
#include <cstdlib>

namespace svhost {

void Fatal(const char *operation, const void *object, const char *problem) {
  std::fprintf(stderr, "svhost: %s(%p): %s\n", operation, object, problem);
  std::fflush(stderr);
  std::abort();
}

}  // namespace svhost
