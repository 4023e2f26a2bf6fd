// The databases that callers have open, the handles of their objects, and the aliases of database
// files. Every database function of the driver ends here. Safe for many threads.
//
// A handle of a database object is 0x8CIIIIII: C the object's class number (0 database,
// 1 cluster, 2 frame, 3 signal, 4 subframe, 5 ECU, 6 LIN schedule, 7 LIN schedule entry, 8 PDU), IIIIII a number from 1 that no other handle of
// a loaded database has. An object keeps its handle while it lives; a database keeps its own while
// it stays loaded.
#ifndef KVOR_SIM_DATABASE_REGISTRY_H
#define KVOR_SIM_DATABASE_REGISTRY_H

#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <unordered_map>
#include <utility>

#include "database_aliases.h"
#include "database_model.h"
#include "database_object.h"
#include "driver_status.h"

namespace nKvorSim {

class DatabaseRegistry {
 public:
  // The name of the driver's one database that lives in memory only; it starts empty.
  static constexpr const char *kMemoryName = ":memory:";

  DatabaseRegistry();
  ~DatabaseRegistry();

  // Opens by alias, by path or as the in-memory database. A database that is loaded already is
  // opened once more and keeps its handle; it stays loaded until it has been closed as often.
  Status Open(const char *name, uint32_t *handle);
  // One close of the database of `handle` (the database's own or one of its objects'), or every
  // close at once if `closeAll` is not 0. The last unloads it: unsaved changes are lost, its
  // handles go.
  Status Close(uint32_t handle, uint32_t closeAll);

  // The database of `handle`, its own or an object's.
  Status DatabaseOf(uint32_t handle, uint32_t *database);
  // One more open of the database of `handle`, which a close of any of its handles gives back.
  Status OpenByRef(uint32_t handle);

  Status FindObject(uint32_t parent, uint32_t objectClass, const char *name, uint32_t *object);
  Status CreateObject(uint32_t parent, uint32_t objectClass, const char *name, uint32_t *object);
  Status DeleteObject(uint32_t object);

  Status GetPropertySize(uint32_t object, uint32_t id, uint32_t *size);
  Status GetProperty(uint32_t object, uint32_t id, uint32_t size, void *value);
  Status SetProperty(uint32_t object, uint32_t id, uint32_t size, const void *value);

  // Writes the database of `handle` to `path`, or to the file it was read from if `path` is null
  // or empty. The database stays bound to its own file.
  Status Save(uint32_t handle, const char *path);

  // Copies the cluster `source` into the cluster `target` of another database (see MergeCluster).
  Status Merge(uint32_t target, uint32_t source, uint32_t copyMode, const char *prefix);

  // The attribute calls (see DbcAttributeText); sizes count the NUL.
  Status GetDbcAttributeSize(uint32_t object, uint32_t mode, const char *name, uint32_t *size);
  Status GetDbcAttribute(uint32_t object, uint32_t mode, const char *name, uint32_t size,
                         char *value, uint32_t *isDefault);

  // The file of `alias` made known at the target of that IP address under the same alias, or
  // taken away there.
  Status Deploy(const char *ipAddress, const char *alias);
  Status Undeploy(const char *ipAddress, const char *alias);

  Status AddAlias(const char *alias, const char *path, uint64_t baudRate);
  Status RemoveAlias(const char *alias);
  // The aliases and their files as comma-separated lists; sizes count the NUL. A list that no
  // longer fits the sizes given is kvErrDatabaseListChanged. `target` 0 is this machine, any
  // other the address of the IP address text of a target, which lists what was deployed there.
  Status GetListSizes(uint64_t target, uint32_t *aliasesSize, uint32_t *pathsSize);
  Status GetList(uint64_t target, uint32_t aliasesSize, char *aliases, uint32_t pathsSize,
                 char *paths, uint32_t *count);

  // A copy of the cluster `cluster` (empty: the database's first) of the database of that name,
  // read from its file if it is not loaded; for sessions, which keep what they were made with.
  Status CopyCluster(const char *database, const char *cluster, tCluster *copy);

  // A handle 0x8FIIIIII that stands for an open that failed with `status` (negative only): every
  // call on it answers `status`, except its close.
  Status CreateErrorObject(Status status, uint32_t *handle);
  // The status that the error object `handle` stands for; 0 if it is not one.
  Status ErrorObjectStatus(uint32_t handle) const;
  // Ends the error object `handle`; false if it is not one.
  bool CloseErrorObject(uint32_t handle);

  // What went wrong in the latest open, save or alias that failed on a file.
  std::string ErrorText() const;
  size_t LoadedCount() const;
  // The next `count` reads of the list find that it changed since its sizes were taken.
  void ChangeListOnRead(int32_t count);

  // Unloads every database, forgets what was deployed, and reads the aliases from their file
  // again at their next use.
  void Reset();

 private:
  struct tLoaded {
    std::string key;   // canonical path, or the in-memory name
    std::string path;  // empty for the in-memory database
    uint32_t handle = 0;
    uint32_t opens = 0;
    tDatabase model;
  };
  struct tEntry {
    tLoaded *loaded;
    tObjectRef ref;
  };
  class cHandleSource;

  tEntry *Resolve(uint32_t handle);
  uint32_t HandleOf(tLoaded *loaded, const tObjectRef &ref);
  void DropHandles(const std::function<bool(const tEntry &)> &doomed);
  void Unload(tLoaded *loaded);
  Status LoadFile(const std::string &path, const std::string &name, uint64_t aliasBaudRate,
                  tDatabase *model);
  // The file that `name` stands for, and the baud rate that its alias gives, if any.
  Status LocateFile(const std::string &name, std::string *canonical, uint64_t *aliasBaudRate);
  Status Fail(Status status, std::string text);
  // The alias list of `target` (0: this machine), or null for a null address text.
  const DatabaseAliases *ListOf(uint64_t target);
  // The aliases, read from their file at the first use after a reset.
  DatabaseAliases &Aliases();
  Status SaveAliases();

  mutable std::mutex mutex_;
  std::map<std::string, std::unique_ptr<tLoaded>> loaded_;  // by key
  std::unordered_map<uint32_t, tEntry> handles_;
  // Handles of deleted objects: their close still gives back an open of their database.
  std::unordered_map<uint32_t, tLoaded *> deleted_;
  std::map<std::pair<uint32_t, const void *>, uint32_t> byObject_;  // class and object
  uint32_t lastNumber_ = 0;
  std::unordered_map<uint32_t, Status> errorObjects_;
  uint32_t lastErrorNumber_ = 0;
  DatabaseAliases aliases_;
  bool aliasesRead_ = false;
  int32_t listChanges_ = 0;
  std::map<std::string, DatabaseAliases> deployed_;  // by IP address
  std::string errorText_;
};

}  // namespace nKvorSim

#endif
