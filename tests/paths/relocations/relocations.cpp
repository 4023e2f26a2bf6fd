// Test build of the optional relocation library libovrelocations.so.0.
//
// KVSV_TEST_RELOCATION_ROOT: when set to a root R, "sharedstatedir" is relocated to R/var/lib and
// "datarootdir" to R/usr/share; every other key keeps its default (result 0). Unset, every key
// gives 0 and the defaults stand, as with a library that relocates nothing.
// KVSV_TEST_RELOCATION_FAIL: a key for which the call fails (negative result), so that the failed
// build of the directory table can be seen.
//
// A test program that links the target `ovrelocations_test` (tests/paths/CMakeLists.txt) has
// this library loaded at start, so the library's own load by soname finds it. The table is built
// once per process: set the variables before anything asks for a directory.
#include <cstdio>
#include <cstdlib>
#include <cstring>

extern "C" __attribute__((visibility("default"))) int get_relocated_dir(const char *key,
                                                                        char *buffer, int size) {
  const char *failing = std::getenv("KVSV_TEST_RELOCATION_FAIL");
  if (failing != nullptr && std::strcmp(failing, key) == 0) return -1;
  const char *root = std::getenv("KVSV_TEST_RELOCATION_ROOT");
  const char *tail = std::strcmp(key, "sharedstatedir") == 0 ? "/var/lib" : nullptr;
  if (std::strcmp(key, "datarootdir") == 0) tail = "/usr/share";
  if (root == nullptr || tail == nullptr) return 0;
  const int written = std::snprintf(buffer, static_cast<std::size_t>(size), "%s%s", root, tail);
  return written < 0 || written >= size ? -1 : written;
}
