// Any content of the project session file given to its two readers: an entry by name and the
// siblings of that entry's interface. Every read must stay inside the readers' buffers, and every
// block they hand out must hold the texts it promises.
#include <unistd.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "core/internal_error.h"
#include "session/session_file_entry.h"
#include "session/session_file_fields.h"
#include "session/session_file_siblings.h"

namespace {

std::string gPath;

void RemoveFile() { unlink(gPath.c_str()); }

// Walks a sibling list to its closing NUL.
size_t CountNames(const char *names) {
  size_t count = 0;
  for (; *names != '\0'; names += std::strlen(names) + 1) ++count;
  return count;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int *, char ***) {
  // Damaged entries are reported; the reports are not what is fuzzed, so they go nowhere.
  nKVSVAPI100::SetErrorLogProvider(nullptr, nullptr);
  char pattern[] = "/tmp/kvsv_session_fuzz_XXXXXX";
  const int fd = mkstemp(pattern);
  if (fd < 0) std::abort();
  close(fd);
  gPath = pattern;
  std::atexit(RemoveFile);
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
  FILE *file = std::fopen(gPath.c_str(), "wb");
  if (file == nullptr) std::abort();
  std::fwrite(data, 1, size, file);
  std::fclose(file);

  // The first line names the session looked for, so that the fuzzer can find entries.
  const char *text = reinterpret_cast<const char *>(data);
  const void *lineEnd = std::memchr(text, '\n', size);
  const std::string firstName(text, lineEnd != nullptr ? static_cast<const char *>(lineEnd) - text
                                                       : size);
  for (const char *name : {firstName.c_str(), "", "B"}) {
    nKVSVAPI100::tSessionEntry entry;
    if (nKVSVAPI100::ReadSessionEntry(name, gPath.c_str(), entry) != 0) continue;
    const char *interfaceName = entry.Interface();
    const std::string key(interfaceName, nKVSVAPI100::InterfaceKeyLength(interfaceName));
    nKVSVAPI100::tMallocBlock names;
    // Each name listed is a line of the file that is not empty.
    if (nKVSVAPI100::ListSiblingSessions(key.c_str(), entry.Database(), entry.Cluster(),
                                         gPath.c_str(), names) == 0 &&
        CountNames(names.get()) > size)
      std::abort();
  }
  return 0;
}
