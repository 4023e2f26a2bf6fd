#include "core/exception_to_status.h"

#include <exception>
#include <new>

#include "core/exception_base.h"
#include "core/internal_error.h"
#include "core/public_status.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint32_t kLibraryExceptionLine = 154;
constexpr uint32_t kStandardExceptionLine = 162;
// The family of this library's statuses; a code of it keeps its low ten bits.
constexpr uint32_t kFamilyBase = 0x3FF63000;
constexpr uint32_t kFamilyMask = 0x7FFFFC00;

}  // namespace

Status ExceptionToStatusRunMode() {
  try {
    throw;
  } catch (const cExceptionBase &e) {
    return ReportInternalError(kComponentKvsvapi, nFile::kRunMode, kLibraryExceptionLine,
                               e.Status()->info);
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  } catch (const std::exception &) {
    return ReportInternalError(kComponentKvsvapi, nFile::kRunMode, kStandardExceptionLine,
                               static_cast<uint32_t>(kvErrInternal));
  }
}

Status ExceptionToStatusPath() {
  try {
    throw;
  } catch (cExceptionBase &e) {
    return ToPublicStatus(*e.Status(), kFamilyBase, kFamilyMask);
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  } catch (...) {
    return kvErrInternal;
  }
}

}  // namespace nKVSVAPI100
