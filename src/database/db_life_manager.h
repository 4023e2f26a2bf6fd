// The account between the driver's database handles and the texts by which host programs hold
// them: which text stands for which object, how many holders each text has, and when the last
// holder is gone so that the driver's close is due.
#ifndef KVSVAPI_DATABASE_DB_LIFE_MANAGER_H
#define KVSVAPI_DATABASE_DB_LIFE_MANAGER_H

#include <atomic>
#include <boost/noncopyable.hpp>
#include <boost/unordered_map.hpp>
#include <cstdint>
#include <memory>
#include <string>

#include "core/recursive_mutex.h"
#include "core/status.h"
#include "core/status_block.h"
#include "database/db_life_database.h"
#include "database/db_object.h"

namespace nKVSVAPI100 {

class cDbLifeManager : boost::noncopyable {
 public:
  using tObjects = boost::unordered_map<uint32_t, tDbObject>;
  using tDatabases = boost::unordered_map<uint32_t, std::unique_ptr<cDbLifeDatabase>>;

  cDbLifeManager();
  // Ends every database's texts, which closes the error objects; the driver's own objects stay.
  ~cDbLifeManager();

  // Looks the counted text `name` up in every database; its object goes to `*handleOut` (0 if
  // none; `handleOut` may be null). Leaves the mutex held for the AddObject that must follow, so
  // that the driver's open between the two is served one thread at a time. A miss is status 0.
  Status FindByName(SvHandle name, uint32_t *handleOut);
  // Registers what the open after FindByName gave (`status` its status, `kind` an eDbOpenKind)
  // and releases the mutex. A text found before only gains a holder; an open that gave no
  // object is registered as an error object carrying `status`, whose handle goes to `object`.
  // A database cannot be opened both automatically and manually: 0xBFF6315E.
  Status AddObject(SvHandle name, tDbObject &object, Status status, uint32_t kind);

  // Starts a walk over the texts of the database of `handle`, whose number goes to `*countOut`.
  // Holds the mutex until EndWalk if the database is known.
  Status BeginWalk(uint32_t handle, uint32_t *countOut);
  // The next text of the walk and its object; all zeroes and an empty text at the end.
  Status NextInWalk(tDbObject *objectOut, std::string *nameOut);
  Status EndWalk();

  // Gives back one holder of `handle`. `*lastOut` (may be null) is 1 when none is left and the
  // driver's close is due; an unknown handle counts as the last one, with 0xBFF63131.
  Status ReleaseByHandle(uint32_t handle, uint32_t *lastOut);
  // Gives back one holder of the text `name` of `handle`. Its last holder also ends `handle`'s
  // entry, even if another text of the same object still has holders.
  Status ReleaseByName(SvHandle name, uint32_t handle, uint32_t *lastOut);
  // Forgets every text of the database of `handle` but the database's own.
  Status RemoveChildren(uint32_t handle);
  // Forgets the database of `handle` with its texts; the objects' entries stay, so that their
  // later releases find no database and count as the last.
  Status RemoveDatabase(uint32_t handle);

  uint32_t GetNumDatabases() const { return numDatabases_.load(); }

  tStatusBlock status;  // negative code if the mutex could not be made
  cRecursiveMutex mutex;

 private:
  // Locks, or reports the failed mutex with `line` and gives the internal error.
  Status Lock(uint32_t line);
  // The entry of `handle` in `objects_`, or null.
  const tDbObject *Known(uint32_t handle) const;
  // Takes the lock for an operation on a known handle: 0xBFF63131 (unlocked) for an unknown one,
  // the internal error of `line` for a failed mutex.
  Status LockKnown(uint32_t handle, uint32_t line);
  // AddObject's registration of an object that FindByName left it, under the lock.
  Status Register(SvHandle name, tDbObject &object, Status status, uint32_t kind);
  // Erasing keeps an open walk's cursor valid: a close that unregistering runs on the walking
  // thread may release texts, or the whole database, under it.
  cDbLifeDatabase::tTexts::iterator EraseText(cDbLifeDatabase::tTexts &texts,
                                              cDbLifeDatabase::tTexts::iterator text);
  void EraseTextsOf(cDbLifeDatabase::tTexts &texts, uint32_t handle);
  void EraseDatabase(tDatabases::iterator database);
  void ClearCursor();

  tObjects objects_;
  tDatabases databases_;
  std::atomic<uint32_t> numDatabases_{0};
  tDatabases::iterator currentDatabase_;
  cDbLifeDatabase::tTexts::iterator currentObject_;
  bool found_ = false;
  bool walkOpen_ = false;
};

cDbLifeManager &GetDbLifeManager();

}  // namespace nKVSVAPI100

#endif
