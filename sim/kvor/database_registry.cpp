#include "database_registry.h"

#include <cstring>
#include <set>

#include "database_alias_file.h"
#include "database_dbc_attributes.h"
#include "database_files.h"
#include "database_merge.h"
#include "database_tree.h"
#include "database_properties.h"
#include "kvsim.h"
#include "kvsvapi.h"

namespace nKvorSim {

namespace {

constexpr uint64_t kDefaultBaudRate = 500000;
constexpr uint32_t kHandleTag = 0x80000000u;
constexpr uint32_t kNumberMask = 0x00FFFFFFu;
// Class number F, which no object of a database has.
constexpr uint32_t kErrorObjectTag = 0x8F000000u;

}  // namespace

class DatabaseRegistry::cHandleSource final : public iObjectHandles {
 public:
  cHandleSource(DatabaseRegistry &registry, tLoaded *loaded)
      : registry_(registry), loaded_(loaded) {}
  uint32_t HandleOf(const tObjectRef &ref) override { return registry_.HandleOf(loaded_, ref); }
  const tObjectRef *Find(uint32_t handle) override {
    const tEntry *entry = registry_.Resolve(handle);
    return entry != nullptr && entry->loaded == loaded_ ? &entry->ref : nullptr;
  }

 private:
  DatabaseRegistry &registry_;
  tLoaded *loaded_;
};

DatabaseRegistry::DatabaseRegistry() = default;
DatabaseRegistry::~DatabaseRegistry() = default;

Status DatabaseRegistry::Fail(Status status, std::string text) {
  errorText_ = std::move(text);
  return status;
}

DatabaseRegistry::tEntry *DatabaseRegistry::Resolve(uint32_t handle) {
  const auto found = handles_.find(handle);
  return found == handles_.end() ? nullptr : &found->second;
}

uint32_t DatabaseRegistry::HandleOf(tLoaded *loaded, const tObjectRef &ref) {
  const std::pair<uint32_t, const void *> key{ref.objectClass, ObjectOf(ref)};
  const auto known = byObject_.find(key);
  if (known != byObject_.end()) return known->second;
  const uint32_t classBits = (ref.objectClass >> 16) << 24;
  uint32_t handle;
  do {
    lastNumber_ = lastNumber_ % kNumberMask + 1;
    handle = kHandleTag | classBits | lastNumber_;
  } while (handles_.count(handle) != 0);
  handles_.emplace(handle, tEntry{loaded, ref});
  byObject_.emplace(key, handle);
  return handle;
}

void DatabaseRegistry::DropHandles(const std::function<bool(const tEntry &)> &doomed) {
  for (auto it = handles_.begin(); it != handles_.end();) {
    if (doomed(it->second)) {
      byObject_.erase({it->second.ref.objectClass, ObjectOf(it->second.ref)});
      it = handles_.erase(it);
    } else {
      ++it;
    }
  }
}

void DatabaseRegistry::Unload(tLoaded *loaded) {
  DropHandles([&](const tEntry &entry) { return entry.loaded == loaded; });
  for (auto it = deleted_.begin(); it != deleted_.end();) {
    it = it->second == loaded ? deleted_.erase(it) : std::next(it);
  }
  loaded_.erase(loaded->key);
}

Status DatabaseRegistry::LocateFile(const std::string &name, std::string *canonical,
                                    uint64_t *aliasBaudRate) {
  *aliasBaudRate = 0;
  std::string path = DatabasePath(name);
  if (const std::optional<tAlias> alias = Aliases().Find(name)) {
    path = alias->path;
    *aliasBaudRate = alias->baudRate;
  }
  *canonical = CanonicalPath(path);
  if (canonical->empty()) {
    return Fail(kvsimErrDatabaseNotFound, name + ": no alias, and no file at " + path);
  }
  return 0;
}

Status DatabaseRegistry::LoadFile(const std::string &path, const std::string &name,
                                  uint64_t aliasBaudRate, tDatabase *model) {
  std::string error;
  const Status status = LoadDatabaseFile(path, name, model, &error);
  if (status != 0) return Fail(status, error);
  if (!error.empty()) errorText_ = error;
  // A file that gives no baud rate takes its alias's, else the usual one.
  for (tCluster &cluster : model->clusters) {
    if (cluster.baudRate == 0) cluster.baudRate = aliasBaudRate != 0 ? aliasBaudRate : kDefaultBaudRate;
  }
  return 0;
}

Status DatabaseRegistry::Open(const char *name, uint32_t *handle) {
  if (name == nullptr || handle == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  const std::string text = name;
  if (text.empty()) return Fail(kvsimErrDatabaseNotFound, "the database name is empty");
  std::string key = text;
  uint64_t aliasBaudRate = 0;
  if (text != kMemoryName) {
    const Status located = LocateFile(text, &key, &aliasBaudRate);
    if (located != 0) return located;
  }
  const auto open = loaded_.find(key);
  if (open != loaded_.end()) {
    ++open->second->opens;
    *handle = open->second->handle;
    return 0;
  }
  auto loaded = std::make_unique<tLoaded>();
  loaded->key = key;
  if (text != kMemoryName) {
    loaded->path = key;
    const Status status = LoadFile(key, text, aliasBaudRate, &loaded->model);
    if (status != 0) return status;
  }
  loaded->model.name = text;
  loaded->opens = 1;
  tObjectRef ref;
  ref.database = &loaded->model;
  tLoaded *raw = loaded.get();
  loaded_.emplace(key, std::move(loaded));
  *handle = raw->handle = HandleOf(raw, ref);
  return 0;
}

Status DatabaseRegistry::Close(uint32_t handle, uint32_t closeAll) {
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(handle);
  const auto deleted = deleted_.find(handle);
  if (entry == nullptr && deleted == deleted_.end()) return kvsimErrInvalidDatabase;
  tLoaded *loaded = entry != nullptr ? entry->loaded : deleted->second;
  if (closeAll != 0 || --loaded->opens == 0) Unload(loaded);
  return 0;
}

Status DatabaseRegistry::DatabaseOf(uint32_t handle, uint32_t *database) {
  if (database == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(handle);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  *database = entry->loaded->handle;
  return 0;
}

Status DatabaseRegistry::OpenByRef(uint32_t handle) {
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(handle);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  ++entry->loaded->opens;
  return 0;
}

Status DatabaseRegistry::FindObject(uint32_t parent, uint32_t objectClass, const char *name,
                                    uint32_t *object) {
  if (name == nullptr || object == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(parent);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  tObjectRef found;
  std::string error;
  const Status status = FindChild(entry->ref, objectClass, name, &found, &error);
  if (status != 0) return error.empty() ? status : Fail(status, error);
  *object = HandleOf(entry->loaded, found);
  return 0;
}

Status DatabaseRegistry::CreateObject(uint32_t parent, uint32_t objectClass, const char *name,
                                      uint32_t *object) {
  if (name == nullptr || object == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(parent);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  tObjectRef made;
  const Status status = CreateChild(entry->ref, objectClass, name, &made);
  if (status != 0) return status;
  if (made.objectClass == kClassCluster) made.cluster->baudRate = kDefaultBaudRate;
  *object = HandleOf(entry->loaded, made);
  return 0;
}

Status DatabaseRegistry::DeleteObject(uint32_t object) {
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(object);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  std::set<const void *> gone;
  const Status status = nKvorSim::DeleteObject(entry->ref, &gone);
  if (status == 0) {
    tLoaded *loaded = entry->loaded;
    deleted_[object] = loaded;
    DropHandles([&](const tEntry &e) { return IsWithin(e.ref, gone); });
  }
  return status;
}

Status DatabaseRegistry::GetPropertySize(uint32_t object, uint32_t id, uint32_t *size) {
  if (size == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(object);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  cHandleSource handles(*this, entry->loaded);
  PropertyValue value;
  const Status status = GetDatabaseProperty(entry->ref, id, handles, &value);
  if (status == 0) *size = static_cast<uint32_t>(value.size());
  return status;
}

Status DatabaseRegistry::GetProperty(uint32_t object, uint32_t id, uint32_t size, void *value) {
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(object);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  cHandleSource handles(*this, entry->loaded);
  PropertyValue known;
  const Status status = GetDatabaseProperty(entry->ref, id, handles, &known);
  if (status != 0) return status;
  // A value of fixed size is read whole or not at all.
  const uint32_t fixed = FixedValueSize(id);
  if (fixed != 0 && size != fixed) return kvsimErrPropertySize;
  return CopyValueOut(known, size, value);
}

Status DatabaseRegistry::SetProperty(uint32_t object, uint32_t id, uint32_t size,
                                     const void *value) {
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(object);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  cHandleSource handles(*this, entry->loaded);
  PropertyValue current;
  const Status known = GetDatabaseProperty(entry->ref, id, handles, &current);
  const Status status = SetDatabaseProperty(entry->ref, id, size, value, handles);
  // A property that the object does not have, or not for its protocol, is that rather than
  // read-only; one that has no value yet may still be set.
  if (known != 0 && (status == kvsimErrPropertyReadOnly || status == kvsimErrPropertySize)) {
    return known;
  }
  return status;
}

Status DatabaseRegistry::Save(uint32_t handle, const char *path) {
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(handle);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  std::string target = path != nullptr ? DatabasePath(path) : std::string();
  if (target.empty()) target = entry->loaded->path;
  if (target.empty()) {
    return Fail(kvsimErrDatabaseWrite, "the in-memory database has no file: give a path");
  }
  std::string error;
  const Status status = SaveDatabaseFile(entry->loaded->model, target, &error);
  return status != 0 ? Fail(status, error) : 0;
}

Status DatabaseRegistry::Merge(uint32_t target, uint32_t source, uint32_t copyMode,
                               const char *prefix) {
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *into = Resolve(target);
  tEntry *from = Resolve(source);
  if (into == nullptr || from == nullptr) return kvsimErrInvalidDatabase;
  if (into->ref.objectClass != kClassCluster || from->ref.objectClass != kClassCluster) {
    return kvsimErrInvalidClass;
  }
  if (into->loaded == from->loaded) return kvsimErrInvalidArgument;
  std::string error;
  const Status status = MergeCluster(
      into->ref.cluster, *from->ref.cluster, static_cast<MergeMode>(copyMode),
      prefix != nullptr ? prefix : "",
      [&](const void *replaced) {
        DropHandles([&](const tEntry &e) { return e.ref.frame == replaced || e.ref.ecu == replaced; });
      },
      &error);
  return status != 0 && !error.empty() ? Fail(status, "merge: " + error) : status;
}

Status DatabaseRegistry::GetDbcAttributeSize(uint32_t object, uint32_t mode, const char *name,
                                             uint32_t *size) {
  if (size == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(object);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  std::string text;
  bool isDefault = false;
  const Status status = DbcAttributeText(entry->ref, mode, name, &text, &isDefault);
  if (status == 0) *size = static_cast<uint32_t>(text.size() + 1);
  return status;
}

Status DatabaseRegistry::GetDbcAttribute(uint32_t object, uint32_t mode, const char *name,
                                         uint32_t size, char *value, uint32_t *isDefault) {
  if (value == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  tEntry *entry = Resolve(object);
  if (entry == nullptr) return kvsimErrInvalidDatabase;
  std::string text;
  bool byDefault = false;
  const Status status = DbcAttributeText(entry->ref, mode, name, &text, &byDefault);
  if (status != 0) return status;
  if (text.size() >= size) return kvsimErrBufferTooSmall;
  std::memcpy(value, text.c_str(), text.size() + 1);
  if (isDefault != nullptr && mode == 0) *isDefault = byDefault ? 1 : 0;
  return 0;
}

Status DatabaseRegistry::Deploy(const char *ipAddress, const char *alias) {
  if (ipAddress == nullptr || alias == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  if (*ipAddress == '\0') return kvsimErrInvalidArgument;
  const std::optional<tAlias> known = Aliases().Find(alias);
  if (!known) return Fail(kvsimErrDatabaseNotFound, std::string(alias) + ": no such alias to deploy");
  deployed_[ipAddress].Add(alias, *known);
  return 0;
}

Status DatabaseRegistry::Undeploy(const char *ipAddress, const char *alias) {
  if (ipAddress == nullptr || alias == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  const auto target = deployed_.find(ipAddress);
  if (target == deployed_.end() || !target->second.Remove(alias)) {
    return Fail(kvsimErrDatabaseNotFound,
                std::string(alias) + ": not deployed at " + ipAddress);
  }
  if (target->second.Count() == 0) deployed_.erase(target);
  return 0;
}

Status DatabaseRegistry::AddAlias(const char *alias, const char *path, uint64_t baudRate) {
  if (alias == nullptr || path == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  const std::string name = alias;
  // The list of aliases is comma-separated, and the in-memory name is taken.
  // The alias file cuts its lines at tabs and line ends.
  if (name.empty() || name.find_first_of(",\t\n") != std::string::npos || name == kMemoryName) {
    return kvsimErrInvalidName;
  }
  const std::string canonical = CanonicalPath(DatabasePath(path));
  if (canonical.empty()) {
    return Fail(kvsimErrDatabaseNotFound, name + ": no file at " + DatabasePath(path));
  }
  if (canonical.find_first_of("\t\n") != std::string::npos) return kvsimErrInvalidName;
  Aliases().Add(name, tAlias{canonical, baudRate});
  return SaveAliases();
}

Status DatabaseRegistry::RemoveAlias(const char *alias) {
  if (alias == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  if (!Aliases().Remove(alias)) return kvsimErrDatabaseNotFound;
  return SaveAliases();
}

DatabaseAliases &DatabaseRegistry::Aliases() {
  if (!aliasesRead_) {
    aliases_ = ReadAliasFile();
    aliasesRead_ = true;
  }
  return aliases_;
}

Status DatabaseRegistry::SaveAliases() {
  std::string error;
  return WriteAliasFile(aliases_, &error) ? 0 : Fail(kvsimErrDatabaseWrite, error);
}

void DatabaseRegistry::ChangeListOnRead(int32_t count) {
  std::lock_guard<std::mutex> lock(mutex_);
  listChanges_ = count;
}

const DatabaseAliases *DatabaseRegistry::ListOf(uint64_t target) {
  if (target == 0) return &Aliases();
  static const DatabaseAliases kNothing;
  const auto found = deployed_.find(reinterpret_cast<const char *>(static_cast<uintptr_t>(target)));
  return found == deployed_.end() ? &kNothing : &found->second;
}

Status DatabaseRegistry::GetListSizes(uint64_t target, uint32_t *aliasesSize, uint32_t *pathsSize) {
  if (aliasesSize == nullptr || pathsSize == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  std::string aliases, paths;
  // No alias at all is no list, not an empty text.
  const DatabaseAliases *list = ListOf(target);
  list->Lists(&aliases, &paths);
  const bool none = list->Count() == 0;
  *aliasesSize = none ? 0 : static_cast<uint32_t>(aliases.size() + 1);
  *pathsSize = none ? 0 : static_cast<uint32_t>(paths.size() + 1);
  return 0;
}

Status DatabaseRegistry::GetList(uint64_t target, uint32_t aliasesSize, char *aliases,
                                 uint32_t pathsSize, char *paths, uint32_t *count) {
  if (aliases == nullptr || paths == nullptr || count == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  const DatabaseAliases *list = ListOf(target);
  std::string aliasList, pathList;
  list->Lists(&aliasList, &pathList);
  if (listChanges_ > 0) {
    --listChanges_;
    return kvErrDatabaseListChanged;
  }
  *count = 0;
  // An empty list fits the sizes 0 that its size call gave: nothing to copy.
  if (list->Count() == 0) return 0;
  if (aliasList.size() >= aliasesSize || pathList.size() >= pathsSize) {
    return kvErrDatabaseListChanged;
  }
  std::memcpy(aliases, aliasList.c_str(), aliasList.size() + 1);
  std::memcpy(paths, pathList.c_str(), pathList.size() + 1);
  *count = static_cast<uint32_t>(list->Count());
  return 0;
}

Status DatabaseRegistry::CopyCluster(const char *database, const char *cluster, tCluster *copy) {
  if (database == nullptr || cluster == nullptr || copy == nullptr) return kvsimErrNullPointer;
  std::lock_guard<std::mutex> lock(mutex_);
  const std::string name = database;
  tDatabase fromFile;
  const tDatabase *source = nullptr;
  if (name == kMemoryName) {
    const auto memory = loaded_.find(name);
    if (memory == loaded_.end()) return kvsimErrDatabaseNotFound;
    source = &memory->second->model;
  } else {
    std::string key;
    uint64_t aliasBaudRate = 0;
    const Status located = LocateFile(name, &key, &aliasBaudRate);
    if (located != 0) return located;
    const auto open = loaded_.find(key);
    if (open != loaded_.end()) {
      source = &open->second->model;
    } else {
      const Status status = LoadFile(key, name, aliasBaudRate, &fromFile);
      if (status != 0) return status;
      source = &fromFile;
    }
  }
  const std::string wanted = cluster;
  for (const tCluster &each : source->clusters) {
    if (wanted.empty() || each.name == wanted) {
      *copy = each;
      return 0;
    }
  }
  return kvsimErrObjectNotFound;
}

std::string DatabaseRegistry::ErrorText() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return errorText_;
}

Status DatabaseRegistry::CreateErrorObject(Status status, uint32_t *handle) {
  if (handle == nullptr) return kvsimErrNullPointer;
  if (status >= 0) return kvsimErrInvalidArgument;
  std::lock_guard<std::mutex> lock(mutex_);
  uint32_t made;
  do {
    lastErrorNumber_ = lastErrorNumber_ % kNumberMask + 1;
    made = kErrorObjectTag | lastErrorNumber_;
  } while (errorObjects_.count(made) != 0);
  errorObjects_.emplace(made, status);
  *handle = made;
  return 0;
}

Status DatabaseRegistry::ErrorObjectStatus(uint32_t handle) const {
  std::lock_guard<std::mutex> lock(mutex_);
  const auto found = errorObjects_.find(handle);
  return found == errorObjects_.end() ? 0 : found->second;
}

bool DatabaseRegistry::CloseErrorObject(uint32_t handle) {
  std::lock_guard<std::mutex> lock(mutex_);
  return errorObjects_.erase(handle) != 0;
}

size_t DatabaseRegistry::LoadedCount() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return loaded_.size();
}

void DatabaseRegistry::Reset() {
  std::lock_guard<std::mutex> lock(mutex_);
  handles_.clear();
  deleted_.clear();
  byObject_.clear();
  errorObjects_.clear();
  loaded_.clear();
  aliases_.Clear();
  aliasesRead_ = false;
  listChanges_ = 0;
  deployed_.clear();
  errorText_.clear();
}

}  // namespace nKvorSim
