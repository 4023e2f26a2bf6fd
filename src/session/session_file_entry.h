// One session's entry of the project session file.
#ifndef KVSVAPI_SESSION_SESSION_FILE_ENTRY_H
#define KVSVAPI_SESSION_SESSION_FILE_ENTRY_H

#include <cstddef>
#include <cstdint>

#include "core/status.h"
#include "session/malloc_block.h"

namespace nKVSVAPI100 {

struct tSessionEntry {
  int32_t mode = 0;
  double resampleRate = 0.0;
  int32_t extra = 0;  // FlexRay key slot or LIN schedule, by interface
  // Interface, list, cluster and database, each NUL-terminated, one after the other; an empty
  // field is a lone NUL.
  tMallocBlock text;

  const char *Interface() const { return Field(0); }
  const char *List() const { return Field(1); }
  const char *Cluster() const { return Field(2); }
  const char *Database() const { return Field(3); }

 private:
  const char *Field(size_t index) const;
};

// Reads the entry of `name` from the file at `path`, reading the file from its start. The first
// name line that begins with all the bytes of `name` is taken, with no look at what follows it,
// so that "CAN" finds a "CAN2" that comes first; a null or empty name takes the first entry.
// Name lines are looked at up to 255 characters, and the rest of a longer one counts as the next
// line. 0xBFF63092: no file, or no such entry. 0xBFF63001 with a report (file 11): an entry that
// cannot be taken apart. 0xBFF63010: out of memory. On failure `entry.text` is empty.
Status ReadSessionEntry(const char *name, const char *path, tSessionEntry &entry);

}  // namespace nKVSVAPI100

#endif
