// What both database tours of the demonstration do as a host program: open and create objects,
// keep the first failure, and read host strings and arrays of strings.
#ifndef KVSVDEMO_DATABASE_CALLS_H
#define KVSVDEMO_DATABASE_CALLS_H

#include <cstdint>
#include <string>
#include <vector>

#include "library_exports.h"

namespace kvsvdemo {

constexpr uint32_t kDatabaseClass = 0x00000;
constexpr uint32_t kClusterClass = 0x10000;
constexpr uint32_t kFrameClass = 0x20000;
constexpr uint32_t kSignalClass = 0x30000;
constexpr uint32_t kLinScheduleClass = 0x60000;
constexpr uint32_t kLinScheduleEntryClass = 0x70000;

// The text of a host string.
std::string HostText(SvHandle string);

// The strings of a host array (its count at byte 0, string handles from byte 8), which the array
// then gives up with itself.
std::vector<std::string> TakeStrings(SvHandle &array);

// What the host knows of one of its references: the handle and the reference's name.
struct tHeld {
  kvsvRefnum reference = 0;
  uint32_t handle = 0;
  std::string name;
};

class cDatabaseCalls {
 public:
  cDatabaseCalls(const tLibraryExports &e, std::string &failedCall, int32_t &status)
      : e_(e), failedCall_(failedCall), status_(status) {}

  // Records the first failure; true while none has occurred.
  bool Ok(const char *call, int32_t status);
  bool Going() const { return status_ == 0; }

  bool Open(uint32_t objectClass, const std::string &text, tHeld &held);
  bool Create(uint32_t parent, uint32_t objectClass, const char *name, tHeld &held);
  // Closes the whole database of `held`, every reference of it with it.
  bool CloseAll(const tHeld &held);

 private:
  const tLibraryExports &e_;
  std::string &failedCall_;
  int32_t &status_;
};

}  // namespace kvsvdemo

#endif
