#include "session/session_file_path.h"

#include <memory>

#include "core/exception_base.h"
#include "core/exception_to_status.h"
#include "core/host_handles.h"
#include "kvsvplatform.h"
#include "paths/path_maker.h"
#include "session/run_mode.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint32_t kNoPathLine = 98;
constexpr uint32_t kAppPathLine = 104;
constexpr uint32_t kPathTextLine = 70;

struct tDestroyPath {
  void operator()(SvPathRecord *path) const { svDestroyPath(path); }
};

// The directory of the built application, as the host gives it.
std::string ApplicationDirectory() {
  std::unique_ptr<SvPathRecord, tDestroyPath> path(svEmptyPath(0));
  if (!path)
    throw cExceptionBase(cExceptionBase::tInternal{}, kComponentKvsvapi, nFile::kRunMode,
                         kNoPathLine);
  int32_t status = svAppPath(path.get());
  if (status != 0)
    throw cExceptionBase(cExceptionBase::tSystemService{}, kComponentKvsvapi, nFile::kRunMode,
                         kAppPathLine, static_cast<uint32_t>(status));
  SvHandle text = nullptr;
  status = svPathToString(path.get(), &text);
  if (status != 0) {
    DisposeHandle(&text);
    throw cExceptionBase(cExceptionBase::tSystemService{}, kComponentKvsvapi, nFile::kRunMode,
                         kPathTextLine, static_cast<uint32_t>(status));
  }
  std::string directory;
  const Status copied = StringFromSvStr(directory, static_cast<const SvStr *>(*text));
  DisposeHandle(&text);
  if (copied == kvErrOutOfMemory) throw std::bad_alloc();
  return directory;
}

}  // namespace

Status GetSessionFilePath(std::string &path) {
  try {
    bool isBuilt = false;
    GetRunMode(isBuilt);
    if (isBuilt) {
      path = ApplicationDirectory() + "/" + kSessionFileName;
    } else {
      path = kvpath::cSvCgSupportLibraryPathMaker::MakePath(kvpath::eTemporarySessionTextFileDir)
                 ->AppendUtf8(kSessionFileName)
                 .GetMultibyte();
    }
    return 0;
  } catch (...) {
    return ExceptionToStatusRunMode();
  }
}

}  // namespace nKVSVAPI100
