// The library's exception: a status with its source location.
#ifndef KVSVAPI_CORE_EXCEPTION_BASE_H
#define KVSVAPI_CORE_EXCEPTION_BASE_H

#include <cstdint>
#include <exception>

#include "core/internal_status.h"

namespace nKVSVAPI100 {
namespace nENSPAN000 {

class cExceptionBase : public std::exception {
 public:
  struct tSystemService {};
  struct tInternal {};
  struct tUser {};

  cExceptionBase(tSystemService, uint32_t component, uint32_t file, uint32_t line, uint32_t info);
  cExceptionBase(tInternal, uint32_t component, uint32_t file, uint32_t line);
  cExceptionBase(tUser, uint32_t component, uint32_t file, uint32_t line, uint32_t code);
  ~cExceptionBase() override;

  // The info word as "0x%08X".
  const char *what() const noexcept override;
  virtual tInternalStatus *Status();
  virtual const tInternalStatus *Status() const;

 private:
  void FormatText();

  char text_[11];
  tInternalStatus status_;
};

}  // namespace nENSPAN000
using nENSPAN000::cExceptionBase;
}  // namespace nKVSVAPI100

#endif
