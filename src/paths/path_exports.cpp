// The path text exports: directories of the driver's files as text in the locale's encoding.
// Every exception stays here and becomes a status.
#include <cstring>
#include <string>

#include "core/exception_base.h"
#include "core/exception_to_status.h"
#include "core/status.h"
#include "kvsvplatform.h"
#include "paths/directory_kind.h"
#include "paths/path.h"
#include "paths/path_maker.h"
#include "paths/path_sysq_wrapper.h"

namespace {

using nKVSVAPI100::cExceptionBase;

constexpr uint32_t kLineHostString = 78;
constexpr uint32_t kLineBufferTooSmall = 169;

std::string DirectoryText(const char *name, uint64_t nameLength) {
  const std::string kindName =
      name == nullptr ? std::string() : std::string(name, static_cast<std::size_t>(nameLength));
  return kvpath::cSvCgSupportLibraryPathMaker::MakePath(kvpath::KindFromName(kindName))
      ->GetMultibyte();
}

}  // namespace

extern "C" {

KVSV_EXPORT kvsvStatus kvsvPathGetMultibyteStringSizeInBytes(const char *name,
                                                             uint64_t nameLength,
                                                             uint64_t *size) {
  if (size == nullptr || (name == nullptr && nameLength != 0)) return kvErrNullArgument;
  try {
    *size = DirectoryText(name, nameLength).size() + 1;
    return 0;
  } catch (...) {
    return nKVSVAPI100::ExceptionToStatusPath();
  }
}

KVSV_EXPORT kvsvStatus kvsvPathGetMultibyteString(const char *name, uint64_t nameLength,
                                                  uint64_t bufferSize, char *buffer) {
  if (buffer == nullptr || (name == nullptr && nameLength != 0)) return kvErrNullArgument;
  try {
    const std::string text = DirectoryText(name, nameLength);
    if (text.size() + 1 > bufferSize) {
      throw cExceptionBase(cExceptionBase::tInternal(), nKVSVAPI100::kComponentKvsvapi,
                           nKVSVAPI100::nFile::kPathExports, kLineBufferTooSmall);
    }
    // Fills the rest of the buffer with NUL.
    std::strncpy(buffer, text.c_str(), static_cast<std::size_t>(bufferSize));
    return 0;
  } catch (...) {
    return nKVSVAPI100::ExceptionToStatusPath();
  }
}

KVSV_EXPORT kvsvStatus kvsvGetPathMultibyteStringAsSvStr(SvHandle name, SvHandle text) {
  try {
    std::string kindName;
    if (name != nullptr && *name != nullptr) {
      const SvStr *block = static_cast<const SvStr *>(*name);
      if (block->cnt > 0) {
        kindName.assign(reinterpret_cast<const char *>(block->str),
                        static_cast<std::size_t>(block->cnt));
      }
    }
    kvpath::cSysqWrapper sysq;
    const kvpath::cPath path(kvpath::KindFromName(kindName), sysq);
    const std::string value = path.GetMultibyte();
    // The host gets the address of our copy of the handle: a handle that it has to make anew
    // stays with us, as the caller's handle is passed by value.
    const int32_t result =
        svStrFromPtr(&text, static_cast<int32_t>(value.size()), value.data());
    if (result != 0) {
      throw cExceptionBase(cExceptionBase::tSystemService(), nKVSVAPI100::kComponentKvsvapi,
                           nKVSVAPI100::nFile::kPathExports, kLineHostString,
                           static_cast<uint32_t>(result));
    }
    return 0;
  } catch (...) {
    return nKVSVAPI100::ExceptionToStatusPath();
  }
}

}  // extern "C"
