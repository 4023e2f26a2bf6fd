// A directory of the driver's files, held as UTF-8.
#ifndef KVSVAPI_PATHS_PATH_H
#define KVSVAPI_PATHS_PATH_H

#include <cstdint>
#include <string>

#include "paths/path_interface.h"
#include "paths/path_sysq_wrapper.h"

namespace kvpath {

class cPath : public cPathInterface {
 public:
  // The directory of `kind` (eDirectoryKind, 0 to 16). Kinds 2 and 14 make their directory with
  // its parents. Throws cExceptionBase (component 22, file 1) or std::bad_alloc.
  cPath(uint32_t kind, cSysqWrapper &sysq);

  cPath &AppendUtf8(const std::string &component) override;
  cPath &AppendMultibyte(const std::string &component) override;
  std::string GetUtf8() const override;
  std::string GetMultibyte() const override;
  void CopyUtf8(char *buffer, std::size_t size) const override;
  void CopyMultibyte(char *buffer, std::size_t size) const override;

 private:
  void Build(uint32_t kind, cSysqWrapper &sysq);

  std::string path_;
};

}  // namespace kvpath

#endif
