// The in-house exception of the path and directory code: a status with its JSON detail.
#ifndef KVSVAPI_DIAGNOSTICS_OVERR_EXCEPTION_H
#define KVSVAPI_DIAGNOSTICS_OVERR_EXCEPTION_H

#include <cstdint>
#include <exception>

#include "diagnostics/json_status.h"

namespace overr {

// What every in-house exception offers, whatever else it derives from.
class ExceptionBase {
 public:
  virtual ~ExceptionBase();
  virtual int32_t Code() const noexcept = 0;
  // The JSON detail document, or "" when there is none.
  virtual const char *Detail() const noexcept = 0;
};

// Carries a copy of a tJsonStatus: its code, and its document in a buffer of its own.
class Exception : public std::exception, public ExceptionBase {
 public:
  explicit Exception(const nKVSVAPI100::tJsonStatus &status);
  Exception(const Exception &other);
  Exception &operator=(const Exception &other) = delete;
  ~Exception() override;

  // The detail document.
  const char *what() const noexcept override;
  int32_t Code() const noexcept override;
  const char *Detail() const noexcept override;
  const nKVSVAPI100::tJsonStatus &Status() const noexcept { return status_; }

 private:
  void CopyFrom(const nKVSVAPI100::tJsonStatus &status);

  nKVSVAPI100::tJsonStatus status_;
};

}  // namespace overr

#endif
