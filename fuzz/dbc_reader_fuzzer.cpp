// Any text given to the database file reader: it reads it or names a line, each warning about
// what it accepted names its line, and what it reads writes out as a text that reads back to what
// writes the very same text again.
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "dbc_reader.h"
#include "dbc_writer.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
  using namespace nKvorSim;
  const std::string text(reinterpret_cast<const char *>(data), size);
  tDatabase database;
  tDbcError error;
  std::vector<tDbcError> warnings;
  if (!ReadDbc(text, &database, &error, &warnings)) {
    if (error.line == 0 || error.message.empty()) std::abort();
    return 0;
  }
  for (const tDbcError &warning : warnings) {
    if (warning.line == 0 || warning.message.empty()) std::abort();
  }
  std::string written, why;
  if (!WriteDbc(database, &written, &why)) std::abort();
  tDatabase again;
  if (!ReadDbc(written, &again, &error)) std::abort();
  std::string rewritten;
  if (!WriteDbc(again, &rewritten, &why) || rewritten != written) std::abort();
  return 0;
}
