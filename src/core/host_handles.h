// Creating, growing and freeing host data: handles, arrays of handles, counted strings.
#ifndef KVSVAPI_CORE_HOST_HANDLES_H
#define KVSVAPI_CORE_HOST_HANDLES_H

#include <cstdint>
#include <string>

#include "core/status.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// Count of a host array, at byte 0 of its block.
inline int32_t &ArrayCount(SvHandle h) { return *static_cast<int32_t *>(*h); }
// Elements of an array of 8-byte elements begin at byte 8.
template <typename T>
inline T *ArrayData8(SvHandle h) {
  return reinterpret_cast<T *>(static_cast<char *>(*h) + 8);
}
// Sets the count to 0 if the handle and its block exist.
void ZeroArrayCount(SvHandle h);

// Creates `*handle` with `size` zeroed bytes, or resizes it. 0, or 0xBFF63010 with the handle left
// as it was.
Status ResizeOrCreateHandle(SvHandle *handle, uint64_t size);

// Output arrays report their allocation failure as 0xBFF630B0; other statuses pass.
inline Status RemapOutputStatus(Status s) { return s == kvErrOutOfMemory ? kvErrOutputMemory : s; }

// Frees `*handle` and sets it to null. A null pointer or handle does nothing. Always 0.
Status DisposeHandle(SvHandle *handle);

// Disposes `*scratch` if set and makes a new handle of `size + 8` bytes, which may be null.
void ReplaceScratchHandle(SvHandle *scratch, uint64_t size);

// Makes room to append `extra` 8-byte elements (with a margin of 20) and returns the address of
// the first free element, or null on failure. The count is not changed.
void *GrowHandleArray(SvHandle *array, uint32_t extra, uint32_t *capacityOut);

// Disposes each element of an array of handles, then the array.
void DisposeHandleArray(SvHandle *array);

// Whether the string handle `string` holds at least one character: a null handle or block, or a
// count of 0 or less, is no text.
inline bool HasText(SvHandle string) {
  return string != nullptr && *string != nullptr && static_cast<const SvStr *>(*string)->cnt > 0;
}

// A failed read keeps the host's count, unless the resize before it left the block too small to
// hold that many bytes: then the string is emptied rather than left to be read past its end. A
// null handle is left alone.
void KeepStringCountInBlock(SvHandle string);

// A new string handle holding `length` bytes of `text`, or null when the host has no memory.
SvHandle NewStringHandle(const char *text, size_t length);

// Copies a counted string. Null `source` gives 0xBFF63015; out of memory 0xBFF63010.
Status StringFromSvStr(std::string &target, const SvStr *source);

// The name attribute of a variant element, length-prefixed as the host wants it.
inline constexpr unsigned char kVariantNameAttribute[] = {1, 'n'};

// Splits a comma-separated text (changed in place) into string handles. Mode 0: a new array of
// strings. Mode 2: appended to an array of variants as their "n" attribute.
Status CommaListToStringArray(char *text, SvHandle *array, int32_t mode);

}  // namespace nKVSVAPI100

#endif
