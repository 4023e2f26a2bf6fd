#include "core/host_handles.h"

#include <cstring>
#include <new>

#include "core/internal_error.h"

namespace nKVSVAPI100 {

namespace {

// Room left behind the appended elements, so that a growing list is not resized on every call.
constexpr uint32_t kGrowMargin = 20;
constexpr uint32_t kCommaListModeLine = 782;

}  // namespace

SvHandle NewStringHandle(const char *text, size_t length) {
  SvHandle string = svNewHandleClr(length + 8);
  if (string == nullptr) return nullptr;
  auto *block = static_cast<SvStr *>(*string);
  block->cnt = static_cast<int32_t>(length);
  std::memcpy(block->str, text, length);
  return string;
}

void ZeroArrayCount(SvHandle h) {
  if (h != nullptr && *h != nullptr) ArrayCount(h) = 0;
}

Status ResizeOrCreateHandle(SvHandle *handle, uint64_t size) {
  if (*handle == nullptr) {
    SvHandle made = svNewHandleClr(size);
    if (made == nullptr) return kvErrOutOfMemory;
    *handle = made;
    return 0;
  }
  return svSetHandleSizeClr(*handle, size) == 0 ? 0 : kvErrOutOfMemory;
}

Status DisposeHandle(SvHandle *handle) {
  if (handle == nullptr || *handle == nullptr) return 0;
  svDisposeHandle(*handle);
  *handle = nullptr;
  return 0;
}

void ReplaceScratchHandle(SvHandle *scratch, uint64_t size) {
  DisposeHandle(scratch);
  *scratch = svNewHandleClr(size + 8);
}

void *GrowHandleArray(SvHandle *array, uint32_t extra, uint32_t *capacityOut) {
  if (capacityOut != nullptr) *capacityOut = 0;
  const uint32_t want = extra + kGrowMargin;
  uint32_t capacity = want;
  uint32_t count = 0;
  if (*array == nullptr) {
    SvHandle made = svNewHandleClr(want * 8u + 8u);
    if (made == nullptr) return nullptr;
    *array = made;
    ArrayCount(made) = 0;
  } else {
    const size_t size = svGetHandleSize(*array);
    capacity = static_cast<uint32_t>((size - 8) / 8);
    count = static_cast<uint32_t>(ArrayCount(*array));
    if (want > capacity - count) {
      // The host may answer a resize with a positive warning; only an error means no room.
      if (svSetHandleSizeClr(*array, size + want * 8u) < 0) return nullptr;
      capacity += want;
    }
  }
  if (capacityOut != nullptr) *capacityOut = capacity;
  return static_cast<char *>(**array) + 8 + static_cast<size_t>(count) * 8;
}

void DisposeHandleArray(SvHandle *array) {
  if (array == nullptr || *array == nullptr || **array == nullptr) return;
  // Each round reads the block again through the handle: the host may have moved it meanwhile.
  for (int32_t i = 0; i < ArrayCount(*array); ++i) DisposeHandle(&ArrayData8<SvHandle>(*array)[i]);
  DisposeHandle(array);
}

void KeepStringCountInBlock(SvHandle string) {
  if (string == nullptr) return;
  SvStr *text = static_cast<SvStr *>(*string);
  const size_t room = svGetHandleSize(string) - sizeof text->cnt;
  if (text->cnt < 0 || static_cast<size_t>(text->cnt) > room) text->cnt = 0;
}

Status StringFromSvStr(std::string &target, const SvStr *source) {
  if (source == nullptr) return kvErrNullArgument;
  // A negative count is as empty as a zero one.
  const size_t length = source->cnt > 0 ? static_cast<size_t>(source->cnt) : 0;
  try {
    target.assign(reinterpret_cast<const char *>(source->str), length);
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }
  return 0;
}

Status CommaListToStringArray(char *text, SvHandle *array, int32_t mode) {
  uint32_t items = 0;
  if (text != nullptr && *text != '\0') {
    items = 1;
    for (char *p = text; *p != '\0'; ++p) {
      if (*p == ',') {
        *p = '\0';
        ++items;
      }
    }
  }

  uint32_t first = 0;
  if (mode == 0) {
    if (*array != nullptr) DisposeHandleArray(array);
    SvHandle made = svNewHandleClr(items * 8u + 8u);
    if (made == nullptr) return kvErrOutOfMemory;
    *array = made;
  } else if (mode == 2) {
    if (GrowHandleArray(array, items, nullptr) == nullptr) return kvErrOutOfMemory;
    first = static_cast<uint32_t>(ArrayCount(*array));
  } else {
    return ReportInternalError(kComponentKvsvapi, nFile::kUtility, kCommaListModeLine, 0);
  }

  const char *item = text;
  for (uint32_t i = 0; i < items; ++i) {
    const size_t length = std::strlen(item);
    SvHandle string = NewStringHandle(item, length);
    item += length + 1;
    // A string that cannot be made leaves its element empty; the others still arrive.
    if (mode == 0) {
      ArrayData8<SvHandle>(*array)[first + i] = string;
    } else if (string != nullptr) {
      svVariantSetStringAttr(ArrayData8<uint64_t>(*array) + first + i, kVariantNameAttribute, string);
      DisposeHandle(&string);
    }
  }

  if (mode == 0)
    ArrayCount(*array) = static_cast<int32_t>(items);
  else
    ArrayCount(*array) += static_cast<int32_t>(items);
  return 0;
}

}  // namespace nKVSVAPI100
