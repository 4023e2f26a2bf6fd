#include "session/system_manager.h"

#include <cstddef>
#include <mutex>
#include <new>

#include "core/host_handles.h"
#include "kvorproperties.h"
#include "session/device_reference_name.h"
#include "session/kvorutility.h"
#include "session/object_class.h"

namespace nKVSVAPI100 {

cSysLifeManager gSystemManager;

namespace {

constexpr std::size_t kMapBuckets = 16;
constexpr float kMapMaxLoad = 1.0f;

constexpr uint64_t kDeviceNameSize = 20;  // the prefix and eight hex digits, before it grows

// Interfaces of this protocol also answer to "<name>/monitor", with the same reference.
constexpr uint32_t kMonitorProtocol = kvProtocol_Ethernet;

SvStr *Text(SvHandle string) { return static_cast<SvStr *>(*string); }

char *TextBytes(SvHandle string) { return static_cast<char *>(*string) + offsetof(SvStr, str); }

bool HasName(const SvHandle *nameRef) {
  return nameRef != nullptr && *nameRef != nullptr && **nameRef != nullptr &&
         Text(*nameRef)->cnt > 0;
}

// What one search owns, freed on every way out.
class cSearchScope : boost::noncopyable {
 public:
  ~cSearchScope() { DisposeHandle(&name); }

  std::unique_ptr<uint32_t[]> refs;
  uint32_t count = 0;
  SvHandle name = nullptr;  // name of the element under test
};

// The list of references. A failure leaves it empty and is the status.
Status ReadReferences(uint32_t system, uint32_t refsProperty, cSearchScope &scope) {
  uint32_t size = 0;
  const Status sized = kvGetPropertySize(system, refsProperty, &size);
  if (sized < 0 || size == 0) return sized;
  scope.refs.reset(new (std::nothrow) uint32_t[(size + 3) / 4]);
  if (!scope.refs) return kvErrOutOfMemory;
  const Status read = kvGetProperty(system, refsProperty, size, scope.refs.get());
  if (read >= 0) scope.count = size / 4;
  return read;
}

Status ReadDeviceName(uint32_t device, SvHandle &name) {
  ReplaceScratchHandle(&name, kDeviceNameSize);
  if (name == nullptr || *name == nullptr) return kvErrOutOfMemory;
  return ReadDeviceReferenceName(device, name);
}

// The driver's name counts its terminating NUL; the counted text does not.
Status ReadTextName(uint32_t object, uint32_t nameProperty, SvHandle &name) {
  uint32_t size = 0;
  const Status sized = kvGetPropertySize(object, nameProperty, &size);
  if (sized < 0) return sized;
  ReplaceScratchHandle(&name, size);
  if (name == nullptr || *name == nullptr) return kvErrOutOfMemory;
  const Status read = kvGetProperty(object, nameProperty, size, TextBytes(name));
  if (read < 0) return read;
  Text(name)->cnt = size > 0 ? static_cast<int32_t>(size - 1) : 0;
  return read;
}

Status ReadName(uint32_t object, uint32_t nameProperty, SvHandle &name) {
  return nameProperty == kvPropDev_SerNum ? ReadDeviceName(object, name)
                                          : ReadTextName(object, nameProperty, name);
}

bool SameName(SvHandle a, SvHandle b) { return svStrCaseCmp(Text(a), Text(b)) == 0; }

// The status of the protocol read if it failed, else 0 and whether `name` + "/monitor" matches.
Status MatchesMonitorName(uint32_t intf, SvHandle name, SvHandle wanted, bool &matches) {
  matches = false;
  uint32_t protocol = 0;
  const Status read = kvGetProperty(intf, kvPropIntf_Protocol, sizeof protocol, &protocol);
  if (read < 0) return read;
  if (protocol != kMonitorProtocol) return 0;
  if (svStrPrintf(name, "%H/monitor", name) < 0) return kvErrOutOfMemory;
  matches = SameName(name, wanted);
  return 0;
}

template <typename Map>
std::unique_ptr<Map> MakeMap() {
  auto map = std::make_unique<Map>(kMapBuckets);
  map->max_load_factor(kMapMaxLoad);
  return map;
}

// Entries left at exit would call the host and the driver from a process that is ending, so
// they are abandoned rather than destroyed.
template <typename Map>
void FreeOrAbandon(std::unique_ptr<Map> &map) {
  if (map->empty())
    map.reset();
  else
    static_cast<void>(map.release());
}

void EraseChildWithHandle(cSysLifeManager::tChildren &children, uint32_t handle) {
  for (auto it = children.begin(); it != children.end(); ++it) {
    if (it->second->handle == handle) {
      children.erase(it);
      return;
    }
  }
}

}  // namespace

cSysLifeChild::cSysLifeChild(std::string name, uint32_t handle)
    : handle(handle), name(std::move(name)) {}

cSysLifeChild::~cSysLifeChild() {
  if (handle != 0) UnregisterReferenceByName(ClassFromHandle(static_cast<int32_t>(handle)), &name);
}

cSysLifeErrorChild::cSysLifeErrorChild(std::string name, Status status)
    : cSysLifeChild(std::move(name), 0) {
  uint32_t made = 0;
  if (kvhdnCreateErrorSession(status, &made) < 0) throw std::bad_alloc();
  handle = made;
}

cSysLifeErrorChild::~cSysLifeErrorChild() { kvClear(handle); }

cSysLifeManager::cSysLifeManager()
    : mutex(status), children(MakeMap<tChildren>()), errorChildren(MakeMap<tErrorChildren>()) {}

cSysLifeManager::~cSysLifeManager() {
  FreeOrAbandon(errorChildren);
  FreeOrAbandon(children);
}

void AcquireSystem(uint32_t *handleOut) noexcept {
  cSysLifeManager &m = gSystemManager;
  std::lock_guard<cRecursiveMutex> lock(m.mutex);
  if (m.refCount.load() != 0) {
    m.refCount.fetch_add(1);
    *handleOut = m.currentSystemHandle;
    return;
  }
  *handleOut = 0;
  const Status opened = kvSystemOpen(handleOut);
  if (opened < 0) {
    // The count stays 0, so that the next acquire asks the driver again.
    kvhdnCreateErrorSession(opened, handleOut);
    m.currentSystemHandle = *handleOut;
    return;
  }
  m.refCount.fetch_add(1);
  m.currentSystemHandle = *handleOut;
  if (m.firstSystemHandle == 0) m.firstSystemHandle = *handleOut;
}

Status FindSystemObject(uint32_t system, uint32_t refsProperty, uint32_t nameProperty,
                        SvHandle *nameRef, uint32_t *handleOut) noexcept {
  *handleOut = 0;
  cSearchScope scope;
  Status last = ReadReferences(system, refsProperty, scope);
  const bool interfaces = (nameProperty & 0xFF0000u) == kClassInterface;
  // A failed element does not end the search: its name matches nothing.
  for (uint32_t i = 0; i < scope.count; ++i) {
    const uint32_t object = scope.refs[i];
    last = ReadName(object, nameProperty, scope.name);
    if (last < 0) continue;
    bool found = SameName(scope.name, *nameRef);
    if (!found && interfaces) {
      const Status monitor = MatchesMonitorName(object, scope.name, *nameRef, found);
      if (monitor < 0) last = monitor;
    }
    if (found) {
      *handleOut = object;
      return last;
    }
  }
  return last < 0 ? last : kvErrSystemObjectNotFound;
}

Status OpenChild(uint32_t refsProperty, uint32_t nameProperty, SvHandle *nameRef,
                 uint32_t *handleOut) {
  if (!HasName(nameRef)) {
    if (handleOut == nullptr) return kvErrInternal;
    return refsProperty == kvPropSys_DevRefs ? kvErrDeviceNameEmpty : kvErrSystemObjectNotFound;
  }
  if (handleOut == nullptr) return kvErrInternal;

  cSysLifeManager &m = gSystemManager;
  std::lock_guard<cRecursiveMutex> lock(m.mutex);
  uint32_t system = 0;
  AcquireSystem(&system);
  const Status found = FindSystemObject(system, refsProperty, nameProperty, nameRef, handleOut);
  try {
    const SvStr *text = Text(*nameRef);
    std::string name(reinterpret_cast<const char *>(text->str),
                     static_cast<std::size_t>(text->cnt));
    if (found < 0) {
      // The failure now travels in the error handle, to surface where the handle is used.
      auto child = std::make_shared<cSysLifeErrorChild>(std::move(name), found);
      (*m.errorChildren)[child->handle] = child;
      *handleOut = child->handle;
      return 0;
    }
    // A child already under this name dies here and takes its host reference with it.
    (*m.children)[name] = std::make_shared<cSysLifeChild>(name, *handleOut);
    return found;
  } catch (const std::exception &) {
    ReleaseChild(system);
    return found < 0 ? found : kvErrOutOfMemory;
  }
}

Status ReleaseChild(uint32_t handle) noexcept {
  cSysLifeManager &m = gSystemManager;
  std::lock_guard<cRecursiveMutex> lock(m.mutex);
  bool counted = true;
  switch (ClassFromHandle(static_cast<int32_t>(handle))) {
    case kClassSession:  // an error handle of a failed open
      m.errorChildren->erase(handle);
      break;
    case kClassSystem:
      break;
    case kClassDevice:
    case kClassInterface:
      EraseChildWithHandle(*m.children, handle);
      break;
    default:
      counted = false;
      break;
  }
  // A release without its acquire wraps the count; it is not guarded against.
  if (counted) m.refCount.fetch_sub(1);
  if (m.refCount.load() == 0 && m.currentSystemHandle != 0) return CloseAll();
  return 0;
}

Status CloseAll() noexcept {
  cSysLifeManager &m = gSystemManager;
  std::lock_guard<cRecursiveMutex> lock(m.mutex);
  m.children->clear();
  m.errorChildren->clear();
  if (m.currentSystemHandle == 0) {
    m.refCount.store(0);
    return 0;
  }
  const Status closed = kvSystemClose(m.currentSystemHandle);
  m.currentSystemHandle = 0;
  m.refCount.store(0);
  return closed;
}

bool RemoveErrorChild(uint32_t handle) noexcept {
  cSysLifeManager &m = gSystemManager;
  if (m.status.code < 0) return false;
  std::lock_guard<cRecursiveMutex> lock(m.mutex);
  return m.errorChildren->erase(handle) != 0;
}

uint32_t RedirectSystemHandle(uint32_t handle, uint32_t propertyId) noexcept {
  if ((propertyId & 0xFF0000u) != kClassSystem) return handle;
  cSysLifeManager &m = gSystemManager;
  if (m.status.code < 0) return handle;
  std::lock_guard<cRecursiveMutex> lock(m.mutex);
  return handle == m.firstSystemHandle ? m.currentSystemHandle : handle;
}

}  // namespace nKVSVAPI100
