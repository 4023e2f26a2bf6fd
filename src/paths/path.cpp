#include "paths/path.h"

#include <cstring>
#include <new>

#include "core/exception_base.h"
#include "core/status.h"
#include "diagnostics/json_status_guard.h"
#include "diagnostics/overr_exception.h"
#include "paths/directory_kind.h"
#include "paths/multibyte.h"
#include "paths/normalize_directory_text.h"
#include "paths/utf8_decode.h"

namespace kvpath {

namespace {

using nKVSVAPI100::cExceptionBase;

// Where the path classes raise, as the error log shows it.
constexpr uint32_t kComponentPaths = 22;
constexpr uint32_t kFilePath = 1;
constexpr uint32_t kLineSystemFailure = 59;
constexpr uint32_t kLineOutOfMemory = 63;
constexpr uint32_t kLineNullBuffer = 71;
constexpr uint32_t kLineBufferTooSmall = 76;
constexpr uint32_t kLineUnknownKind = 154;
constexpr uint32_t kLineInvalidUtf8 = 413;

// The detail of a failed conversion names the converter, whichever way it ran.
constexpr char kConversionErrorConstant[] = "err";
constexpr char kConversionFile[] = "mbsToUtf8";
constexpr uint32_t kConversionLine = 77;

void ThrowConversionFailure(int32_t code) {
  nKVSVAPI100::cJsonStatusGuard guard;
  nKVSVAPI100::SetJsonStatusError(guard.Status(), code, kConversionErrorConstant, kConversionFile,
                                  kConversionLine);
}

void ThrowIfInvalidUtf8(const std::string &text) {
  const unsigned char *p = reinterpret_cast<const unsigned char *>(text.data());
  const unsigned char *end = p + text.size();
  while (p < end) {
    uint32_t codePoint = 0;
    if (DecodeUtf8(p, end, codePoint) != kUtf8Ok) {
      throw cExceptionBase(cExceptionBase::tInternal(), kComponentPaths, kFilePath,
                           kLineInvalidUtf8);
    }
  }
}

void CopyWithNul(const std::string &text, char *buffer, std::size_t size) {
  if (buffer == nullptr && size != 0) {
    throw cExceptionBase(cExceptionBase::tUser(), kComponentPaths, kFilePath, kLineNullBuffer,
                         static_cast<uint32_t>(kvErrNullBuffer));
  }
  if (size <= text.size()) {
    throw cExceptionBase(cExceptionBase::tUser(), kComponentPaths, kFilePath,
                         kLineBufferTooSmall, static_cast<uint32_t>(kvErrBufferTooSmall));
  }
  std::memcpy(buffer, text.c_str(), text.size() + 1);
}

}  // namespace

cPath::cPath(uint32_t kind, cSysqWrapper &sysq) {
  try {
    Build(kind, sysq);
  } catch (const overr::Exception &e) {
    throw cExceptionBase(cExceptionBase::tSystemService(), kComponentPaths, kFilePath,
                         kLineSystemFailure, static_cast<uint32_t>(e.Code()));
  } catch (const std::bad_alloc &) {
    throw cExceptionBase(cExceptionBase::tUser(), kComponentPaths, kFilePath, kLineOutOfMemory,
                         static_cast<uint32_t>(kvErrOutOfMemory));
  }
}

void cPath::Build(uint32_t kind, cSysqWrapper &sysq) {
  static const char *const kErrorLanguages[] = {"English", "German", "French", "Japanese"};
  switch (kind) {
    case eAliasFileDir:
    case 6:
    case eTemporarySessionTextFileDir:
      AppendUtf8(sysq.GetSharedStateDir()).AppendUtf8("kvor");
      break;
    case eDatabaseCacheDir:
      AppendUtf8(sysq.GetSharedStateDir()).AppendUtf8("kvor").AppendUtf8("dbCache");
      break;
    case eDatabaseEditorSettingsIniDir:
    case eDatabaseConfigDir:
      AppendUtf8(sysq.GetUserConfigDir(false)).AppendUtf8("kvor");
      sysq.CreateDirectoryPath(path_, nullptr);
      break;
    case eErrorLogDir:
    case 11:
    case 12:
      AppendUtf8(sysq.GetSharedStateDir()).AppendUtf8("kvor").AppendUtf8("log");
      break;
    case 4:
      AppendUtf8(sysq.GetDataRootDir()).AppendUtf8("kvor").AppendUtf8("firmware");
      break;
    case 5:
    case 15:
      AppendUtf8(sysq.GetDataRootDir()).AppendUtf8("kvor");
      break;
    case 7:
    case 8:
    case 9:
    case 10:
      AppendUtf8(sysq.GetShareDir()).AppendUtf8("errors").AppendUtf8(kErrorLanguages[kind - 7]);
      break;
    case 16:
      AppendUtf8("/home/svuser");
      break;
    default:
      throw cExceptionBase(cExceptionBase::tInternal(), kComponentPaths, kFilePath,
                           kLineUnknownKind);
  }
}

cPath &cPath::AppendUtf8(const std::string &component) {
  ThrowIfInvalidUtf8(component);
  std::string path = path_;
  std::string tail = component;
  ovsysq::NormalizeDirectoryText(path);
  ovsysq::NormalizeDirectoryText(tail);
  path_ = path.empty() ? tail : path + "/" + tail;
  return *this;
}

cPath &cPath::AppendMultibyte(const std::string &component) {
  std::string utf8;
  const int32_t result = MultibyteToUtf8(component.c_str(), false, utf8);
  if (result < 0) ThrowConversionFailure(result);
  return AppendUtf8(utf8);
}

std::string cPath::GetUtf8() const { return path_; }

std::string cPath::GetMultibyte() const {
  std::string text;
  const int32_t result = Utf8ToMultibyte(path_.c_str(), false, text);
  if (result < 0) ThrowConversionFailure(result);
  return text;
}

void cPath::CopyUtf8(char *buffer, std::size_t size) const {
  CopyWithNul(GetUtf8(), buffer, size);
}

void cPath::CopyMultibyte(char *buffer, std::size_t size) const {
  CopyWithNul(GetMultibyte(), buffer, size);
}

}  // namespace kvpath
