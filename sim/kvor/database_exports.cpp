// Databases: kvdbCloseDatabase.
#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvdbCloseDatabase(uint32_t database, uint32_t closeAll) {
  CallArgs args;
  args.function = "kvdbCloseDatabase";
  args.object = database;
  args.size1 = closeAll;
  return RunDriverCall(args, 0, [&](CallArgs &) -> Status {
    Driver &driver = Driver::Instance();
    // A database that failed to open is an error handle, which answers with its failure.
    if (const Status failure = driver.ErrorSessionStatus(database)) return failure;
    return driver.Databases().Close(database, closeAll);
  });
}
