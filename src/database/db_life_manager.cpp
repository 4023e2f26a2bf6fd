#include "database/db_life_manager.h"

#include <cstddef>
#include <mutex>
#include <new>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

namespace {

// Lines of the internal reports of this module, as the error log names them.
constexpr uint32_t kLineFindByName = 129;
constexpr uint32_t kLineFoundWithoutObject = 189;
constexpr uint32_t kLineReleaseByHandle = 300;
constexpr uint32_t kLineReleaseByName = 420;
constexpr uint32_t kLineBeginWalk = 544;
constexpr uint32_t kLineNextOutsideWalk = 577;
constexpr uint32_t kLineRemoveDatabase = 633;
constexpr uint32_t kLineRemoveChildren = 672;


std::string TextOf(SvHandle name) {
  if (!HasText(name)) return std::string();
  const SvStr *text = static_cast<const SvStr *>(*name);
  return std::string(reinterpret_cast<const char *>(text->str),
                     static_cast<std::size_t>(text->cnt));
}

void Store(uint32_t *out, uint32_t value) {
  if (out != nullptr) *out = value;
}

cDbLifeManager gDbLifeManager;

}  // namespace

cDbLifeManager &GetDbLifeManager() { return gDbLifeManager; }

cDbLifeManager::cDbLifeManager() : mutex(status) { ClearCursor(); }

cDbLifeManager::~cDbLifeManager() {
  databases_.clear();
  objects_.clear();
}

Status cDbLifeManager::Lock(uint32_t line) {
  if (!mutex.Valid())
    return ReportInternalError(kComponentKvsvapi, nFile::kDatabaseLife, line,
                               static_cast<uint32_t>(status.code));
  mutex.lock();
  return 0;
}

const tDbObject *cDbLifeManager::Known(uint32_t handle) const {
  const auto known = objects_.find(handle);
  return known == objects_.end() ? nullptr : &known->second;
}

// The handle is looked up under the lock, so that a release on another thread cannot change the
// map under the lookup; a failed mutex still answers an unknown handle first.
Status cDbLifeManager::LockKnown(uint32_t handle, uint32_t line) {
  if (!mutex.Valid()) return Known(handle) == nullptr ? kvErrDbObjectNotFound : Lock(line);
  mutex.lock();
  if (Known(handle) != nullptr) return 0;
  mutex.unlock();
  return kvErrDbObjectNotFound;
}

cDbLifeDatabase::tTexts::iterator cDbLifeManager::EraseText(
    cDbLifeDatabase::tTexts &texts, cDbLifeDatabase::tTexts::iterator text) {
  const bool underCursor = walkOpen_ && currentDatabase_ != databases_.end() &&
                           &currentDatabase_->second->texts == &texts && currentObject_ == text;
  const auto next = texts.erase(text);
  if (underCursor) currentObject_ = next;
  return next;
}

void cDbLifeManager::EraseTextsOf(cDbLifeDatabase::tTexts &texts, uint32_t handle) {
  for (auto it = texts.begin(); it != texts.end();) {
    if (it->second->object.object == handle)
      it = EraseText(texts, it);
    else
      ++it;
  }
}

void cDbLifeManager::EraseDatabase(tDatabases::iterator database) {
  if (database == currentDatabase_) currentDatabase_ = databases_.end();
  databases_.erase(database);
  numDatabases_.store(static_cast<uint32_t>(databases_.size()));
}

void cDbLifeManager::ClearCursor() {
  currentDatabase_ = databases_.end();
  currentObject_ = cDbLifeDatabase::tTexts::iterator();
}

Status cDbLifeManager::FindByName(SvHandle name, uint32_t *handleOut) {
  Store(handleOut, 0);
  const Status locked = Lock(kLineFindByName);
  if (locked != 0) return locked;
  found_ = false;
  try {
    const std::string text = TextOf(name);
    for (auto database = databases_.begin(); database != databases_.end(); ++database) {
      const auto hit = database->second->texts.find(text);
      if (hit == database->second->texts.end()) continue;
      found_ = true;
      currentDatabase_ = database;
      currentObject_ = hit;
      Store(handleOut, hit->second->object.object);
      break;
    }
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;  // the lock stays held for AddObject all the same
  }
  return 0;
}

Status cDbLifeManager::AddObject(SvHandle name, tDbObject &object, Status status, uint32_t kind) {
  object.isErrorObject = 0;
  Status result = 0;
  // A database of 0 is an open that the table answered: a text opened again costs no holder.
  if (object.database != 0 && HasText(name)) result = Register(name, object, status, kind);
  found_ = false;
  if (mutex.Valid()) mutex.unlock();
  return result;
}

Status cDbLifeManager::Register(SvHandle name, tDbObject &object, Status status, uint32_t kind) {
  if (found_) {
    if (object.object == 0)
      return ReportInternalError(kComponentKvsvapi, nFile::kDatabaseLife,
                                 kLineFoundWithoutObject, static_cast<uint32_t>(status));
    ++currentObject_->second->refCount;
    return 0;
  }
  if (object.object == 0) {
    // The failure travels in an error object, to surface where the handle is first used.
    const Status made = kvhdndbCreateErrorObject(status, &object.object);
    if (made < 0) return made;
    object.isErrorObject = 1;
  }
  // From here the record owns the error object: every way out that drops it closes it.
  std::unique_ptr<cDbLifeObject> text(new (std::nothrow) cDbLifeObject(object));
  if (!text) {
    if (object.isErrorObject != 0) kvdbCloseDatabase(object.object, 1);
    return kvErrOutOfMemory;
  }
  try {
    const auto known = databases_.find(object.database);
    if (known != databases_.end()) {
      cDbLifeDatabase &database = *known->second;
      if (database.openKind == kDbOpenUndecided) database.openKind = kind;
      if (kind != kDbOpenUndecided && kind != database.openKind) return kvErrDatabaseModeConflict;
      database.texts.emplace(TextOf(name), std::move(text));
    } else {
      auto database = std::make_unique<cDbLifeDatabase>();
      database->texts.emplace(TextOf(name), std::move(text));
      database->openKind = kind;
      databases_.emplace(object.database, std::move(database));
      numDatabases_.store(static_cast<uint32_t>(databases_.size()));
    }
    objects_[object.object] = object;
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }
  return 0;
}

Status cDbLifeManager::BeginWalk(uint32_t handle, uint32_t *countOut) {
  Store(countOut, 0);
  const Status locked = LockKnown(handle, kLineBeginWalk);
  if (locked != 0) return locked;
  const auto database = databases_.find(Known(handle)->database);
  if (database == databases_.end()) {
    ClearCursor();
    return EndWalk();
  }
  currentDatabase_ = database;
  currentObject_ = database->second->texts.begin();
  Store(countOut, static_cast<uint32_t>(database->second->texts.size()));
  walkOpen_ = true;
  return 0;
}

Status cDbLifeManager::NextInWalk(tDbObject *objectOut, std::string *nameOut) {
  if (objectOut != nullptr) *objectOut = tDbObject();
  if (nameOut != nullptr) nameOut->clear();
  if (!walkOpen_)
    return ReportInternalError(kComponentKvsvapi, nFile::kDatabaseLife, kLineNextOutsideWalk, 0);
  if (currentDatabase_ == databases_.end() ||
      currentObject_ == currentDatabase_->second->texts.end())
    return 0;
  try {
    if (nameOut != nullptr) *nameOut = currentObject_->first;
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }
  if (objectOut != nullptr) *objectOut = currentObject_->second->object;
  ++currentObject_;
  return 0;
}

Status cDbLifeManager::EndWalk() {
  walkOpen_ = false;
  if (mutex.Valid()) mutex.unlock();
  return 0;
}

Status cDbLifeManager::ReleaseByHandle(uint32_t handle, uint32_t *lastOut) {
  Store(lastOut, 0);
  const Status locked = LockKnown(handle, kLineReleaseByHandle);
  if (locked == kvErrDbObjectNotFound) Store(lastOut, 1);  // the caller closes it at the driver
  if (locked != 0) return locked;
  std::lock_guard<cRecursiveMutex> held(mutex, std::adopt_lock);
  const auto database = databases_.find(Known(handle)->database);
  if (database == databases_.end()) {
    ClearCursor();
    Store(lastOut, 1);
    return 0;
  }
  if (database->second->ReleaseOne(handle)) return 0;
  EraseTextsOf(database->second->texts, handle);
  if (database->second->texts.empty()) EraseDatabase(database);
  objects_.erase(handle);
  Store(lastOut, 1);
  return 0;
}

Status cDbLifeManager::ReleaseByName(SvHandle name, uint32_t handle, uint32_t *lastOut) {
  if (!HasText(name)) return ReleaseByHandle(handle, lastOut);
  Store(lastOut, 0);
  const Status locked = LockKnown(handle, kLineReleaseByName);
  if (locked != 0) return locked;
  std::lock_guard<cRecursiveMutex> held(mutex, std::adopt_lock);
  const auto database = databases_.find(Known(handle)->database);
  if (database == databases_.end()) {
    Store(lastOut, 1);
    return 0;
  }
  cDbLifeDatabase::tTexts &texts = database->second->texts;
  const auto text = texts.find(TextOf(name));
  if (text == texts.end() || text->second->refCount == 0) return ReleaseByHandle(handle, lastOut);
  if (--text->second->refCount != 0) return 0;
  Store(lastOut, 1);
  EraseText(texts, text);
  if (texts.empty()) EraseDatabase(database);
  objects_.erase(handle);
  return 0;
}

Status cDbLifeManager::RemoveChildren(uint32_t handle) {
  const Status locked = LockKnown(handle, kLineRemoveChildren);
  if (locked != 0) return locked;
  std::lock_guard<cRecursiveMutex> held(mutex, std::adopt_lock);
  const auto database = databases_.find(Known(handle)->database);
  if (database == databases_.end()) return 0;
  cDbLifeDatabase::tTexts &texts = database->second->texts;
  for (auto it = texts.begin(); it != texts.end();) {
    if (it->second->object.object == handle) {
      ++it;
      continue;
    }
    objects_.erase(it->second->object.object);
    it = EraseText(texts, it);
  }
  return 0;
}

Status cDbLifeManager::RemoveDatabase(uint32_t handle) {
  const Status locked = LockKnown(handle, kLineRemoveDatabase);
  if (locked != 0) return locked;
  std::lock_guard<cRecursiveMutex> held(mutex, std::adopt_lock);
  const auto database = databases_.find(Known(handle)->database);
  if (database != databases_.end()) EraseDatabase(database);
  return 0;
}

}  // namespace nKVSVAPI100
