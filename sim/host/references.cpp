#include "references.h"

#include <algorithm>
#include <cstring>
#include <mutex>
#include <new>

#include "counted_text.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace svhost {

namespace {

// Constants of the registration protocol.
constexpr int32_t kProtocol21 = 21;
constexpr int32_t kProtocol8 = 8;
constexpr int32_t kProtocol1 = 1;

// Cookies start high, so that a cookie cut to 32 bits by its holder no longer matches, and they
// are never reused, not even across a reset, so that a stale cookie is never mistaken for a new.
constexpr uint64_t kFirstCookie = 0x5356'0001'0000'0001ull;

class ReferenceRegistry {
 public:
  static ReferenceRegistry &Instance() {
    // Never destroyed: references may be removed from static destructors at exit.
    static ReferenceRegistry *registry = new ReferenceRegistry;
    return *registry;
  }

  // The forced status, if any, decides first; see svsimSetRefStatus.
  int32_t Register(Reference reference, SvRefnum *cookie) {
    std::lock_guard<std::mutex> lock(mutex_);
    if (forced_ < 0) return forced_;
    reference.cookie = nextCookie_++;
    references_.push_back(std::move(reference));
    *cookie = references_.back().cookie;
    return forced_;
  }

  int32_t Unregister(uint64_t cookie) {
    std::lock_guard<std::mutex> lock(mutex_);
    if (forced_ < 0) return forced_;
    auto it = std::find_if(references_.begin(), references_.end(),
                           [cookie](const Reference &r) { return r.cookie == cookie; });
    if (it == references_.end()) return SVSIM_REF_NOT_FOUND;
    references_.erase(it);
    return forced_;
  }

  int32_t UnregisterByName(const std::string &name, const std::string &kind,
                           const std::string &className) {
    std::lock_guard<std::mutex> lock(mutex_);
    if (forced_ < 0) return forced_;
    const size_t before = references_.size();
    references_.erase(std::remove_if(references_.begin(), references_.end(),
                                     [&](const Reference &r) {
                                       return r.name == name && r.kind == kind &&
                                              r.className == className;
                                     }),
                      references_.end());
    return references_.size() == before ? SVSIM_REF_NOT_FOUND : forced_;
  }

  template <typename Predicate>
  bool Find(Predicate matches, Reference &found) {
    std::lock_guard<std::mutex> lock(mutex_);
    int32_t index = 0;
    for (const Reference &r : references_) {
      if (matches(r, index++)) {
        found = r;
        return true;
      }
    }
    return false;
  }

  int32_t Count() {
    std::lock_guard<std::mutex> lock(mutex_);
    return static_cast<int32_t>(references_.size());
  }

  std::vector<Reference> TakeAll() {
    std::lock_guard<std::mutex> lock(mutex_);
    std::vector<Reference> all;
    all.swap(references_);
    return all;
  }

  void SetForced(int32_t status) {
    std::lock_guard<std::mutex> lock(mutex_);
    forced_ = status;
  }

 private:
  std::mutex mutex_;
  std::vector<Reference> references_;
  uint64_t nextCookie_ = kFirstCookie;
  int32_t forced_ = 0;
};

void CopyField(char *field, size_t size, const std::string &text) {
  const size_t copied = std::min(text.size(), size - 1);
  std::memcpy(field, text.data(), copied);
  field[copied] = '\0';
}

void ToInfo(const Reference &r, SvsimRefInfo *info) {
  info->cookie = r.cookie;
  info->handle = r.handle;
  info->keep = r.keep;
  CopyField(info->name, sizeof info->name, r.name);
  CopyField(info->kind, sizeof info->kind, r.kind);
  CopyField(info->className, sizeof info->className, r.className);
  CopyField(info->libraryPattern, sizeof info->libraryPattern, r.libraryPattern);
  CopyField(info->openName, sizeof info->openName, r.openName);
  CopyField(info->closeName, sizeof info->closeName, r.closeName);
}

}  // namespace

std::vector<Reference> TakeAllReferences() { return ReferenceRegistry::Instance().TakeAll(); }

void ResetReferences() {
  ReferenceRegistry::Instance().TakeAll();
  ReferenceRegistry::Instance().SetForced(0);
}

}  // namespace svhost

using svhost::Reference;
using svhost::ReferenceRegistry;

extern "C" {

int32_t svRegisterRefKind3(SvHandle name, uint32_t handle, SvHandle kind, SvHandle className,
                           int32_t c21, SvRefnum *reference, int32_t c8, SvHandle libraryPattern,
                           int32_t c1, SvHandle openName, SvHandle closeName, int32_t z0,
                           int32_t z1, int32_t keep) {
  if (reference == nullptr || name == nullptr || kind == nullptr || className == nullptr ||
      libraryPattern == nullptr || openName == nullptr || closeName == nullptr ||
      c21 != svhost::kProtocol21 || c8 != svhost::kProtocol8 || c1 != svhost::kProtocol1 ||
      z0 != 0 || z1 != 0)
    return SVSIM_REF_BAD_ARGUMENT;
  try {
    const char *op = "svRegisterRefKind3";
    Reference r;
    r.handle = handle;
    r.keep = keep;
    r.name = svhost::HandleText(name, op);
    r.kind = svhost::HandleText(kind, op);
    r.className = svhost::HandleText(className, op);
    r.libraryPattern = svhost::HandleText(libraryPattern, op);
    r.openName = svhost::HandleText(openName, op);
    r.closeName = svhost::HandleText(closeName, op);
    return ReferenceRegistry::Instance().Register(std::move(r), reference);
  } catch (const std::bad_alloc &) {
    return SVSIM_REF_NO_MEMORY;
  }
}

int32_t svUnregisterRef(SvRefnum reference) {
  return ReferenceRegistry::Instance().Unregister(reference);
}

int32_t svsimUnregisterRefByName(SvHandle name, SvHandle kind, SvHandle className, int32_t c21) {
  if (name == nullptr || kind == nullptr || className == nullptr || c21 != svhost::kProtocol21)
    return SVSIM_REF_BAD_ARGUMENT;
  try {
    const char *op = "svUnregisterRefByName";
    return ReferenceRegistry::Instance().UnregisterByName(svhost::HandleText(name, op),
                                                          svhost::HandleText(kind, op),
                                                          svhost::HandleText(className, op));
  } catch (const std::bad_alloc &) {
    return SVSIM_REF_NO_MEMORY;
  }
}

int32_t svsimRefCount(void) { return ReferenceRegistry::Instance().Count(); }

int32_t svsimFindRef(const char *name, SvsimRefInfo *info) {
  if (name == nullptr || info == nullptr) return 0;
  Reference found;
  const std::string wanted(name);
  if (!ReferenceRegistry::Instance().Find(
          [&](const Reference &r, int32_t) { return r.name == wanted; }, found))
    return 0;
  svhost::ToInfo(found, info);
  return 1;
}

int32_t svsimGetRef(int32_t index, SvsimRefInfo *info) {
  if (info == nullptr) return 0;
  Reference found;
  if (!ReferenceRegistry::Instance().Find(
          [index](const Reference &, int32_t i) { return i == index; }, found))
    return 0;
  svhost::ToInfo(found, info);
  return 1;
}

void svsimSetRefStatus(int32_t status) { ReferenceRegistry::Instance().SetForced(status); }

}  // extern "C"
