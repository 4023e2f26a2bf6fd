// Texts as the host hands them to the database life manager, and handles that no other test of
// the program uses, since the manager lives as long as the process.
#ifndef KVSVAPI_TESTS_DB_LIFE_TEST_SUPPORT_H
#define KVSVAPI_TESTS_DB_LIFE_TEST_SUPPORT_H

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "database/db_life_manager.h"

namespace kvsvtest {

// A counted string behind a handle, owned by the test.
class cHostText {
 public:
  explicit cHostText(const std::string &text)
      : bytes_(offsetof(SvStr, str) + text.size() + 1), block_(bytes_.data()) {
    SvStr *str = reinterpret_cast<SvStr *>(bytes_.data());
    str->cnt = static_cast<int32_t>(text.size());
    std::memcpy(str->str, text.data(), text.size());
  }
  cHostText(const cHostText &) = delete;
  cHostText &operator=(const cHostText &) = delete;

  SvHandle Handle() { return &block_; }

 private:
  std::vector<unsigned char> bytes_;
  void *block_;
};

// A database handle of its own for each call, in the driver's form, with room below for objects.
inline uint32_t FreshDatabase() {
  static uint32_t next = 0x80000100u;
  next += 0x100u;
  return next;
}

// Registers `text` for `object` as an open by the host would: the lookup, then the add.
inline nKVSVAPI100::Status Open(const std::string &text, nKVSVAPI100::tDbObject object,
                                nKVSVAPI100::Status status = 0, uint32_t kind = 0) {
  nKVSVAPI100::cDbLifeManager &m = nKVSVAPI100::GetDbLifeManager();
  cHostText name(text);
  uint32_t found = 0;
  m.FindByName(name.Handle(), &found);
  return m.AddObject(name.Handle(), object, status, kind);
}

inline uint32_t Lookup(const std::string &text) {
  nKVSVAPI100::cDbLifeManager &m = nKVSVAPI100::GetDbLifeManager();
  cHostText name(text);
  uint32_t found = 0;
  m.FindByName(name.Handle(), &found);
  nKVSVAPI100::tDbObject nothing;
  m.AddObject(name.Handle(), nothing, 0, 0);
  return found;
}

}  // namespace kvsvtest

#endif
