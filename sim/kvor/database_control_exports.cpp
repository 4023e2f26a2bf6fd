// The kvsim controls of the databases: the text of the latest file failure, the loaded count, a
// list that changes under its reader.
#include <cstdio>
#include <string>

#include "driver.h"
#include "kvsim.h"

using namespace nKvorSim;

extern "C" {

int32_t kvsimDatabaseErrorText(char *text, uint32_t size) {
  const std::string error = Driver::Instance().Databases().ErrorText();
  if (text != nullptr && size != 0) std::snprintf(text, size, "%s", error.c_str());
  return static_cast<int32_t>(error.size());
}

int32_t kvsimLoadedDatabaseCount(void) {
  return static_cast<int32_t>(Driver::Instance().Databases().LoadedCount());
}

void kvsimChangeDatabaseList(int32_t count) {
  Driver::Instance().Databases().ChangeListOnRead(count);
}

}  // extern "C"
