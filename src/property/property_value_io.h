// How property values travel between host data and the driver's byte buffers: the size protocol
// of array and text reads and the empty-source rule of writes. Written over a policy of the three
// driver calls, so that session objects and database objects share one path.
#ifndef KVSVAPI_PROPERTY_PROPERTY_VALUE_IO_H
#define KVSVAPI_PROPERTY_PROPERTY_VALUE_IO_H

#include <boost/noncopyable.hpp>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <new>

#include "core/host_handles.h"
#include "core/status.h"
#include "kvsvplatform.h"
#include "session/malloc_block.h"

namespace nKVSVAPI100 {

// The driver's property calls on sessions, systems, devices and interfaces.
struct tSessionPropertyCalls {
  static Status GetSize(uint32_t object, uint32_t id, uint32_t *size) {
    return kvGetPropertySize(object, id, size);
  }
  static Status Get(uint32_t object, uint32_t id, uint32_t size, void *buffer) {
    return kvGetProperty(object, id, size, buffer);
  }
  static Status Set(uint32_t object, uint32_t id, uint32_t size, const void *buffer) {
    return kvSetProperty(object, id, size, buffer);
  }
};

// The driver's property calls on database objects.
struct tDbPropertyCalls {
  static Status GetSize(uint32_t object, uint32_t id, uint32_t *size) {
    return kvdbGetPropertySize(object, id, size);
  }
  static Status Get(uint32_t object, uint32_t id, uint32_t size, void *buffer) {
    return kvdbGetProperty(object, id, size, buffer);
  }
  static Status Set(uint32_t object, uint32_t id, uint32_t size, const void *buffer) {
    return kvdbSetProperty(object, id, size, buffer);
  }
};

// Host arrays and strings carry a 32-bit count in front of their data.
constexpr uint32_t kHostCountBytes = 4;
// A string handle holds its count and three spare bytes beyond the driver's size.
constexpr uint32_t kStringSlack = 7;

// Size protocol: the value's size from the driver, the handle made or grown to that size plus
// `slack`, the value read behind the count, then `afterRead(readStatus, size)` in any case once
// the read was made. A failed size call leaves the handle as it was; no room gives 0xBFF63010.
template <class tCalls, class tAfterRead>
Status ReadSizedIntoHandle(uint32_t object, uint32_t id, SvHandle *value, uint32_t slack,
                           tAfterRead afterRead) {
  if (value == nullptr) return kvErrNullArgument;
  uint32_t size = 0;
  Status status = tCalls::GetSize(object, id, &size);
  if (status < 0) return status;
  status = ResizeOrCreateHandle(value, uint64_t{size} + slack);
  if (status < 0) return status;
  status = tCalls::Get(object, id, size, static_cast<char *>(**value) + kHostCountBytes);
  afterRead(status, size);
  return status;
}

// An array of numbers: the count is the driver's size in elements, stored whatever the read
// returned. The slack (7, 6 and 4 bytes for 1-, 2- and 4-byte elements) is the host's layout.
template <class tCalls, class tElement>
Status ReadArrayProperty(uint32_t object, uint32_t id, SvHandle *value) {
  static_assert(sizeof(tElement) == 1 || sizeof(tElement) == 2 || sizeof(tElement) == 4,
                "host arrays of properties hold 1-, 2- or 4-byte numbers");
  constexpr uint32_t slack = 8 - sizeof(tElement);
  return ReadSizedIntoHandle<tCalls>(object, id, value, slack, [value](Status, uint32_t size) {
    ArrayCount(*value) = static_cast<int32_t>(size / sizeof(tElement));
  });
}

// Text into a block of our own: size, allocation, read. The block gets a NUL behind the
// driver's bytes, so that it is a C string even if the driver's text was cut.
// The 4-byte handles that list property `listId` of `object` holds into `list` (a scoped array),
// or `object` alone when `listId` is `self`. A failed or empty read leaves `count` 0 and gives the
// read's status.
template <class tCalls, class tList>
Status ReadHandleList(uint32_t object, uint32_t listId, uint32_t self, tList &list,
                      uint32_t &count) {
  count = 0;
  if (listId == self) {
    list.reset(new (std::nothrow) uint32_t[1]);
    if (!list) return kvErrOutOfMemory;
    list[0] = object;
    count = 1;
    return 0;
  }
  uint32_t size = 0;
  Status status = tCalls::GetSize(object, listId, &size);
  if (status < 0 || size / sizeof(uint32_t) == 0) return status;
  list.reset(new (std::nothrow) uint32_t[size / sizeof(uint32_t)]);
  if (!list) return kvErrOutOfMemory;
  status = tCalls::Get(object, listId, size, list.get());
  if (status >= 0) count = size / sizeof(uint32_t);
  return status;
}

template <class tCalls>
Status ReadTextBlock(uint32_t object, uint32_t id, tMallocBlock &block) {
  uint32_t size = 0;
  Status status = tCalls::GetSize(object, id, &size);
  if (status < 0) return status;
  block.reset(static_cast<char *>(std::malloc(size_t{size} + 1)));
  if (!block) return kvErrOutOfMemory;
  block.get()[size] = '\0';
  return tCalls::Get(object, id, size, block.get());
}

// A comma list of the driver as a new host array of strings at `*value`, the old one disposed
// of with its strings. A failed read leaves `*value` as it was.
template <class tCalls>
Status ReadCommaListProperty(uint32_t object, uint32_t id, SvHandle *value) {
  if (value == nullptr) return kvErrNullArgument;
  tMallocBlock text;
  const Status status = ReadTextBlock<tCalls>(object, id, text);
  if (status < 0) return status;
  const Status split = CommaListToStringArray(text.get(), value, 0);
  return split < 0 ? split : status;
}

// What a write sends: a byte count and a buffer, null for "empty".
struct tPropertySource {
  uint32_t size = 0;
  const void *buffer = nullptr;
};

// A host array as a write sends it, in place: empty when the pointer, the handle, the block or
// the count is null or zero, and then size 0 with a null buffer.
template <class tElement>
tPropertySource ArraySource(const SvHandle *value) {
  if (value == nullptr || *value == nullptr || **value == nullptr) return {};
  const int32_t count = ArrayCount(*value);
  if (count <= 0) return {};
  return {static_cast<uint32_t>(count) * static_cast<uint32_t>(sizeof(tElement)),
          static_cast<const char *>(**value) + kHostCountBytes};
}

// A host string as a write sends it: a NUL-terminated copy, length + 1 bytes. An empty source
// (pointer, handle, block or length null or zero) sends a single NUL.
class cTextSource : boost::noncopyable {
 public:
  explicit cTextSource(const SvHandle *value) {
    if (value == nullptr || *value == nullptr || **value == nullptr) return;
    const auto *text = static_cast<const SvStr *>(**value);
    if (text->cnt <= 0) return;
    const size_t length = static_cast<size_t>(text->cnt);
    copy_.reset(static_cast<char *>(std::malloc(length + 1)));
    if (!copy_) {
      status_ = kvErrOutOfMemory;
      return;
    }
    std::memcpy(copy_.get(), text->str, length);
    copy_.get()[length] = '\0';
    source_ = {static_cast<uint32_t>(length + 1), copy_.get()};
  }

  // 0, or 0xBFF63010 when the copy could not be made; then nothing may be sent.
  Status status() const { return status_; }
  const tPropertySource &source() const { return source_; }

 private:
  static constexpr char kEmpty[1] = {'\0'};
  tMallocBlock copy_;
  Status status_ = 0;
  tPropertySource source_{1, kEmpty};
};

}  // namespace nKVSVAPI100

#endif
