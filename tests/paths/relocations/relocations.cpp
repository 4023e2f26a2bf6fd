// Test build of the optional relocation library libovrelocations.so.0.
//
// KVSV_TEST_RELOCATION_ROOT: when set to a directory R, "sharedstatedir" is relocated to
// R/var/lib and "datarootdir" to R/usr/share; every other key keeps its default (result 0).
// Unset, every key gives 0 and the defaults stand, as with a library that relocates nothing.
// KVSV_TEST_RELOCATION_FAIL: a key for which the call fails (negative result), so that the
// failed build of the directory table can be seen.
//
// A test program that links the target `ovrelocations_test` (tests/paths/CMakeLists.txt) has
// this library loaded at start, so the library's own load by soname finds it. The table is built
// once per process: set the variables before anything asks for a directory.
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

const char *RelocatedTail(const char *key) {
  if (std::strcmp(key, "sharedstatedir") == 0) return "/var/lib";
  if (std::strcmp(key, "datarootdir") == 0) return "/usr/share";
  return nullptr;
}

}  // namespace

extern "C" __attribute__((visibility("default"))) int get_relocated_dir(const char *key,
                                                                        char *buffer, int size) {
  const char *failing = std::getenv("KVSV_TEST_RELOCATION_FAIL");
  if (failing != nullptr && std::strcmp(failing, key) == 0) return -1;
  const char *root = std::getenv("KVSV_TEST_RELOCATION_ROOT");
  const char *tail = RelocatedTail(key);
  if (root == nullptr || tail == nullptr) return 0;
  const int written = std::snprintf(buffer, static_cast<std::size_t>(size), "%s%s", root, tail);
  if (written < 0 || written >= size) return -1;
  return written;
}
