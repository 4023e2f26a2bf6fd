// Status texts: kvStatusToString.
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"

using namespace nKvorSim;

KVOR_DRIVER_API void kvStatusToString(int32_t status, uint32_t size, char *text) {
  CallArgs args;
  args.function = "kvStatusToString";
  args.object = static_cast<uint32_t>(status);
  args.size1 = size;
  RunDriverCall(args, 0, [&](CallArgs &) -> Status {
    WriteStatusText(status, size, text);
    return 0;
  });
}
