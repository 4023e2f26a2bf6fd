// The pieces of the project session file that both of its readers take apart the same way.
//
// The file holds three lines per session: its name; eight fields (mode, whole and millionth
// parts of the resample rate, extra, then the tokens interface, list and cluster, and the
// database, which runs to the end of the line); and a line that is not read. A field that begins
// with '-' stands for an empty text.
#ifndef KVSVAPI_SESSION_SESSION_FILE_FIELDS_H
#define KVSVAPI_SESSION_SESSION_FILE_FIELDS_H

#include <cstddef>
#include <cstdint>
#include <cstdio>

#include <boost/noncopyable.hpp>

#include "core/status.h"

namespace nKVSVAPI100 {

// The longest line that a reader looks at at once is 255 characters, with its NUL 256 bytes.
constexpr size_t kSessionFileLineBuffer = 256;

// The file, open for reading while the object lives.
class cSessionFileStream : boost::noncopyable {
 public:
  explicit cSessionFileStream(const char *path);
  ~cSessionFileStream();
  bool IsOpen() const { return file_ != nullptr; }
  FILE *Get() const { return file_; }

 private:
  FILE *file_;
};

// The numbers at the start of an entry's second line.
struct tEntryNumbers {
  int32_t mode = 0;
  int32_t rateWhole = 0;
  int32_t rateMicro = 0;
  int32_t extra = 0;

  double ResampleRate() const { return rateWhole + rateMicro / 1000000.0; }
};

// Reports an entry that cannot be taken apart, at `line` of the session file's reports: always
// 0xBFF63001.
Status ReportMalformedEntry(uint32_t line);

// Characters from the current position up to and including the next line feed, or to the end of
// the file; the position is left where it was. -1 if it cannot be put back.
long CountLineAhead(FILE *file);

// Skips what is left of the current line, its line feed included.
void SkipRestOfLine(FILE *file);

// The four numbers and the interface token, which is cut to `room` - 1 bytes. False unless all
// five were read.
bool ReadNumbersAndToken(FILE *file, tEntryNumbers &numbers, char *token, size_t room);

// The next token separated by white space, cut to `room` - 1 bytes. False if there is none or no
// room for one.
bool ReadToken(FILE *file, char *token, size_t room);

// The database field: the rest of the line after one separating blank, without its line feed and
// a carriage return before it. The character before the end is dropped even when the file ends
// without a line feed. False if nothing is left to read.
bool ReadDatabaseField(FILE *file, char *field, size_t room);

// A field that begins with '-' is empty.
void DashMeansEmpty(char *field);

// Length of the interface name without its last '/' and what follows: "CAN1/monitor" and "CAN1"
// belong to one interface.
size_t InterfaceKeyLength(const char *interfaceName);

}  // namespace nKVSVAPI100

#endif
