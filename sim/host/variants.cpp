// Host variants: the 8-byte slot of an array of references holds a pointer to a record that the
// host owns, made on the first attribute set on a zeroed slot.
#include <cstring>
#include <map>
#include <memory>
#include <mutex>
#include <new>
#include <string>
#include <unordered_set>

#include "counted_text.h"
#include "fatal.h"
#include "handle_store.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace svhost {

namespace {

struct Variant {
  std::map<std::string, std::string> stringAttributes;
};

class VariantStore {
 public:
  static VariantStore &Instance() {
    // Never destroyed: host programs may free variants from static destructors at exit.
    static VariantStore *store = new VariantStore;
    return *store;
  }

  int32_t SetStringAttribute(void *slot, const std::string &name, const std::string &value) {
    std::lock_guard<std::mutex> lock(mutex_);
    Variant *variant = InSlot(slot, "svVariantSetStringAttr");
    if (variant == nullptr) {
      auto made = std::make_unique<Variant>();
      live_.insert(made.get());
      variant = made.release();
      std::memcpy(slot, &variant, sizeof variant);
    }
    variant->stringAttributes[name] = value;
    return 0;
  }

  bool GetStringAttribute(const void *slot, const std::string &name, std::string &value) {
    std::lock_guard<std::mutex> lock(mutex_);
    const Variant *variant = InSlot(slot, "svsimVariantGetStringAttr");
    if (variant == nullptr) return false;
    auto it = variant->stringAttributes.find(name);
    if (it == variant->stringAttributes.end()) return false;
    value = it->second;
    return true;
  }

  void Free(void *slot) {
    std::lock_guard<std::mutex> lock(mutex_);
    Variant *variant = InSlot(slot, "svsimVariantFree");
    if (variant == nullptr) return;
    live_.erase(variant);
    delete variant;
    std::memset(slot, 0, sizeof variant);
  }

  uint64_t Live() {
    std::lock_guard<std::mutex> lock(mutex_);
    return live_.size();
  }

 private:
  // The variant in `slot`, or null for a zeroed slot. Aborts on a slot that holds anything else.
  Variant *InSlot(const void *slot, const char *operation) {
    Variant *variant = nullptr;
    std::memcpy(&variant, slot, sizeof variant);
    if (variant != nullptr && live_.count(variant) == 0)
      Fatal(operation, slot, "slot holds neither null nor a live variant");
    return variant;
  }

  std::mutex mutex_;
  std::unordered_set<Variant *> live_;
};

// Attribute names come with one length byte before their text.
std::string AttributeName(const unsigned char *prefixed) {
  return std::string(reinterpret_cast<const char *>(prefixed + 1), prefixed[0]);
}

}  // namespace

}  // namespace svhost

using svhost::VariantStore;

extern "C" {

int32_t svVariantSetStringAttr(void *variant, const unsigned char *attributeName, SvHandle value) {
  if (variant == nullptr || attributeName == nullptr || attributeName[0] == 0)
    return SVSIM_ERR_ARGUMENT;
  try {
    return VariantStore::Instance().SetStringAttribute(
        variant, svhost::AttributeName(attributeName),
        svhost::HandleText(value, "svVariantSetStringAttr"));
  } catch (const std::bad_alloc &) {
    return SVSIM_ERR_MEMORY;
  }
}

int32_t svsimVariantGetStringAttr(const void *variant, const char *name, char *text, size_t size) {
  if (variant == nullptr || name == nullptr) return -1;
  std::string value;
  if (!VariantStore::Instance().GetStringAttribute(variant, name, value)) return -1;
  if (text != nullptr && size != 0) {
    const size_t copied = value.size() < size - 1 ? value.size() : size - 1;
    std::memcpy(text, value.data(), copied);
    text[copied] = '\0';
  }
  return static_cast<int32_t>(value.size());
}

void svsimVariantFree(void *variant) {
  if (variant != nullptr) VariantStore::Instance().Free(variant);
}

void svsimDisposeVariantArray(SvHandle array) {
  if (array == nullptr) return;
  svhost::HandleStore &handles = svhost::HandleStore::Instance();
  const size_t size = handles.Size(array, "svsimDisposeVariantArray");
  if (size >= 8) {
    const int32_t count = *static_cast<const int32_t *>(*array);
    if (count > 0 && static_cast<size_t>(count) > (size - 8) / 8)
      svhost::Fatal("svsimDisposeVariantArray", array, "count runs past the end of the array");
    for (size_t i = 0; i < static_cast<size_t>(count > 0 ? count : 0); ++i)
      svsimVariantFree(static_cast<char *>(*array) + 8 + i * 8);
  }
  handles.Dispose(array, "svsimDisposeVariantArray");
}

uint64_t svsimLiveVariants(void) { return VariantStore::Instance().Live(); }

}  // extern "C"
