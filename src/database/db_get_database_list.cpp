// kvsvdbGetDatabaseList: the driver's aliases and their files as two host string arrays. The list
// may change between the driver's size call and its list call, which the driver says with
// kvErrDatabaseListChanged; the export then starts over, a bounded number of times.
#include <cstdint>
#include <memory>
#include <new>

#include "core/host_handles.h"
#include "core/status.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"

using namespace nKVSVAPI100;

namespace {

// The first read and ten more after a change of the list.
constexpr int kRounds = 11;

Status ReadListOnce(uint64_t target, SvHandle *aliases, SvHandle *filePaths) {
  uint32_t aliasesSize = 0;
  uint32_t pathsSize = 0;
  Status status = kvdbGetDatabaseListSizes(target, &aliasesSize, &pathsSize);
  // No alias at all leaves both arrays as the host had them.
  if (status < 0 || aliasesSize == 0) return status;

  std::unique_ptr<char[]> aliasText(new (std::nothrow) char[aliasesSize]);
  std::unique_ptr<char[]> pathText(new (std::nothrow) char[pathsSize == 0 ? 1 : pathsSize]);
  if (aliasText == nullptr || pathText == nullptr) return kvErrOutOfMemory;
  uint32_t count = 0;
  status = kvdbGetDatabaseList(target, aliasesSize, aliasText.get(), pathsSize, pathText.get(),
                               &count);
  if (status < 0) return status;
  const Status split = CommaListToStringArray(aliasText.get(), aliases, 0);
  if (split < 0) return split;
  const Status pathSplit = CommaListToStringArray(pathText.get(), filePaths, 0);
  return pathSplit < 0 ? pathSplit : status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetDatabaseList(uint64_t target, SvHandle *aliases,
                                                        SvHandle *filePaths) {
  if (aliases == nullptr || filePaths == nullptr) return kvErrNullArgument;
  Status status = 0;
  for (int round = 0; round < kRounds; ++round) {
    status = ReadListOnce(target, aliases, filePaths);
    if (status != kvErrDatabaseListChanged) break;
  }
  return status;
}
