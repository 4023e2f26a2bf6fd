#include "paths/directory_table.h"

#include <cerrno>
#include <cstring>
#include <new>
#include <utility>
#include <vector>

#include "diagnostics/ovdynlib.h"

namespace ovsysq {

namespace {

using tEntries = std::vector<std::pair<std::string, std::string>>;

const char *const kDefaults[][2] = {
    {"prefixdir", "/usr"},
    {"execprefixdir", "/usr"},
    {"bindir", "/usr/bin"},
    {"sbindir", "/usr/sbin"},
    {"libdir", "/usr/lib"},
    {"lib32dir", "/usr/lib"},
    {"lib64dir", "/usr/lib64"},
    {"nativelibdir", "/usr/lib64"},
    {"multiarchlibdir", "/usr/lib/x86_64-linux-gnu"},
    {"libexecdir", "/usr/libexec"},
    {"sharedstatedir", "/var/lib"},
    {"datarootdir", "/usr/share"},
    {"datadir", "/usr/share"},
    {"sysconfdir", "/etc"},
    {"localstatedir", "/var"},
    {"runstatedir", "/var/run"},
    {"includedir", "/usr/include"},
    {"docdir", "/usr/share/doc"},
    {"initddir", "/etc/init.d"},
};

const char kRelocationLibrary[] = "libovrelocations.so.0";
const char kRelocationSymbol[] = "get_relocated_dir";
// Load now, with global symbols.
constexpr int kRelocationLoadFlags = 258;
constexpr int kRelocatedSize = 255;

using tGetRelocatedDir = int (*)(const char *key, char *buffer, int size);

// The first pair of `key` in table order, or null.
std::pair<std::string, std::string> *Find(tEntries &entries, const char *key) {
  for (auto &entry : entries) {
    if (entry.first == key) return &entry;
  }
  return nullptr;
}

void Relocate(tEntries &entries, tJsonStatus &buildStatus) {
  // A library that is absent leaves the defaults: its failure stays in a local status.
  tJsonStatus local;
  void *library = nKVSVAPI100::ovdynlib_load(kRelocationLibrary, kRelocationLoadFlags, local);
  void *symbol = nKVSVAPI100::ovdynlib_symbol(library, kRelocationSymbol, local);
  if (local.code >= 0 && symbol != nullptr) {
    const auto getRelocatedDir = reinterpret_cast<tGetRelocatedDir>(symbol);
    for (const auto &pair : kDefaults) {
      char buffer[kRelocatedSize + 1] = {0};
      const int result = getRelocatedDir(pair[0], buffer, kRelocatedSize);
      if (result < 0) {
        char *cursor = SetOsFault(buildStatus, kResourceNotFound, __FILE__, __LINE__, 0,
                                  "get_relocated_dir failed");
        jsonz::AddString(cursor, "key", pair[0], RetryFor(buildStatus));
      } else if (result > 0) {
        auto *entry = Find(entries, pair[0]);
        if (entry != nullptr) {
          entry->second = buffer;
        } else {
          entries.emplace_back(pair[0], buffer);
        }
      }
    }
  }
  if (library != nullptr) nKVSVAPI100::ovdynlib_close(library);
  nKVSVAPI100::ReleaseJsonStatus(local);
}

struct tDirectoryTable {
  tEntries entries;
  tJsonStatus status;

  tDirectoryTable() {
    try {
      for (const auto &pair : kDefaults) entries.emplace_back(pair[0], pair[1]);
      Relocate(entries, status);
    } catch (const std::bad_alloc &) {
      SetOsFault(status, kMemoryFull, __FILE__, __LINE__, ENOMEM, "table allocation failed");
    }
  }
  ~tDirectoryTable() { nKVSVAPI100::ReleaseJsonStatus(status); }
  tDirectoryTable(const tDirectoryTable &) = delete;
  tDirectoryTable &operator=(const tDirectoryTable &) = delete;
};

const tDirectoryTable &Table() {
  static const tDirectoryTable table;
  return table;
}

// Gives `status` the build's failure with its detail.
void MergeBuildStatus(const tJsonStatus &build, tJsonStatus &status) {
  if (build.code == 0 || !nKVSVAPI100::SetJsonStatus(status, build.code)) return;
  if (build.buffer == nullptr) return;
  if (nKVSVAPI100::ReserveJsonRoom(status, std::strlen(build.buffer)) != nullptr) {
    jsonz::StoreDocument(status.buffer, status.capacity, build.buffer);
  }
}

}  // namespace

std::string LookupDirectory(const char *key, tJsonStatus &status) {
  const tDirectoryTable &table = Table();
  MergeBuildStatus(table.status, status);
  if (status.code < 0) return std::string();
  for (const auto &entry : table.entries) {
    if (entry.first == key) return entry.second;
  }
  char *cursor = SetOsFault(status, kOsFault, __FILE__, __LINE__, 0, "directory key not found");
  jsonz::AddString(cursor, "key", key, RetryFor(status));
  return std::string();
}

}  // namespace ovsysq
