// The registered texts of one database, and how the database was opened.
#ifndef KVSVAPI_DATABASE_DB_LIFE_DATABASE_H
#define KVSVAPI_DATABASE_DB_LIFE_DATABASE_H

#include <boost/noncopyable.hpp>
#include <boost/unordered_map.hpp>
#include <cstdint>
#include <memory>
#include <string>

#include "database/db_life_object.h"

namespace nKVSVAPI100 {

// Open kinds of a database: its objects all come either from the host's automatic references or
// from a program's explicit opens, never from both.
enum eDbOpenKind : uint32_t { kDbOpenAutomatic = 0, kDbOpenManual = 1, kDbOpenUndecided = 2 };

class cDbLifeDatabase : boost::noncopyable {
 public:
  using tTexts = boost::unordered_map<std::string, std::unique_ptr<cDbLifeObject>>;

  // Takes one holder from the first text of `handle` that still has one. True if any text of
  // `handle` keeps a holder afterwards.
  bool ReleaseOne(uint32_t handle);

  tTexts texts;
  uint32_t openKind = kDbOpenUndecided;
};

}  // namespace nKVSVAPI100

#endif
