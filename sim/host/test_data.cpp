// Host data made and read for tests, through the same memory manager as the host operations.
#include <cstring>
#include <new>
#include <string>

#include "counted_text.h"
#include "handle_store.h"
#include "svsim.h"

namespace {

constexpr size_t kArrayHeader = 8;

}  // namespace

extern "C" {

SvHandle svsimMakeDoubleArray(const double *values, int32_t count) {
  if (count < 0 || (values == nullptr && count > 0)) return nullptr;
  const size_t bytes = static_cast<size_t>(count) * sizeof(double);
  SvHandle array = svhost::HandleStore::Instance().Create(kArrayHeader + bytes);
  if (array == nullptr) return nullptr;
  std::memcpy(*array, &count, sizeof count);
  if (bytes != 0) std::memcpy(static_cast<char *>(*array) + kArrayHeader, values, bytes);
  return array;
}

int32_t svsimReadDoubleArray(SvHandle array, double *values, int32_t capacity) {
  if (array == nullptr) return 0;
  const size_t size = svhost::HandleStore::Instance().Size(array, "svsimReadDoubleArray");
  if (*array == nullptr || size < kArrayHeader) return 0;
  int32_t count = 0;
  std::memcpy(&count, *array, sizeof count);
  int32_t copied = count < capacity ? count : capacity;
  const int32_t fits = static_cast<int32_t>((size - kArrayHeader) / sizeof(double));
  if (copied > fits) copied = fits;
  if (values != nullptr && copied > 0)
    std::memcpy(values, static_cast<const char *>(*array) + kArrayHeader,
                static_cast<size_t>(copied) * sizeof(double));
  return count;
}

SvHandle svsimMakeString(const char *text) {
  SvHandle string = nullptr;
  const char *bytes = text == nullptr ? "" : text;
  if (svhost::StoreText(&string, bytes, std::strlen(bytes), "svsimMakeString") != 0) return nullptr;
  return string;
}

int32_t svsimReadString(SvHandle string, char *text, size_t size) {
  std::string value;
  try {
    value = svhost::HandleText(string, "svsimReadString");
  } catch (const std::bad_alloc &) {
    return -1;
  }
  if (text != nullptr && size != 0) {
    const size_t copied = value.size() < size - 1 ? value.size() : size - 1;
    std::memcpy(text, value.data(), copied);
    text[copied] = '\0';
  }
  return static_cast<int32_t>(value.size());
}

}  // extern "C"
