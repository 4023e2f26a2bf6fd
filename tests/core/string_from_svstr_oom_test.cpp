// A counted string that cannot be copied for want of memory: the failure becomes a status.
#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <cstring>
#include <new>
#include <string>
#include <vector>

#include "core/host_handles.h"

namespace {

// Allocations of this program come here; an armed size makes the first request of at least
// that many bytes fail.
std::atomic<size_t> gFailFrom{0};

}  // namespace

void *operator new(std::size_t size) {
  size_t failFrom = gFailFrom.load();
  if (failFrom != 0 && size >= failFrom && gFailFrom.compare_exchange_strong(failFrom, 0))
    throw std::bad_alloc();
  if (void *memory = std::malloc(size != 0 ? size : 1)) return memory;
  throw std::bad_alloc();
}

// This program's operator new takes its memory from malloc, so free is the matching release; the
// compiler cannot see that through the replacement.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"
void operator delete(void *memory) noexcept { std::free(memory); }
void operator delete(void *memory, std::size_t) noexcept { std::free(memory); }
#pragma GCC diagnostic pop

namespace {

using namespace nKVSVAPI100;

TEST(StringFromSvStr, OutOfMemoryIsAStatusAndTheTargetStays) {
  constexpr int32_t kLength = 4000;
  std::vector<unsigned char> block(4 + kLength, 'x');
  const int32_t count = kLength;
  std::memcpy(block.data(), &count, 4);
  std::string target = "kept";

  gFailFrom.store(kLength);
  EXPECT_EQ(StringFromSvStr(target, reinterpret_cast<const SvStr *>(block.data())),
            kvErrOutOfMemory);
  EXPECT_EQ(gFailFrom.load(), 0u) << "the copy asked for no memory";
  EXPECT_EQ(target, "kept");

  EXPECT_EQ(StringFromSvStr(target, reinterpret_cast<const SvStr *>(block.data())), 0);
  EXPECT_EQ(target.size(), static_cast<size_t>(kLength));
}

}  // namespace
