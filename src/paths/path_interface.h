// A directory path that can be extended and read as UTF-8 or in the locale's multibyte encoding.
#ifndef KVSVAPI_PATHS_PATH_INTERFACE_H
#define KVSVAPI_PATHS_PATH_INTERFACE_H

#include <cstddef>
#include <string>

namespace kvpath {

// Every operation reports failure by exception: cExceptionBase, overr::Exception or
// std::bad_alloc. An export that uses a path turns them into a status.
class cPathInterface {
 public:
  virtual ~cPathInterface() = default;

  // Appends one component given as UTF-8; an invalid sequence anywhere in it throws.
  virtual cPathInterface &AppendUtf8(const std::string &component) = 0;
  // Appends one component given in the process locale's multibyte encoding.
  virtual cPathInterface &AppendMultibyte(const std::string &component) = 0;
  virtual std::string GetUtf8() const = 0;
  virtual std::string GetMultibyte() const = 0;
  // Copy the text with its terminating NUL; `size` must exceed the text's length.
  virtual void CopyUtf8(char *buffer, std::size_t size) const = 0;
  virtual void CopyMultibyte(char *buffer, std::size_t size) const = 0;

 protected:
  cPathInterface() = default;
  cPathInterface(const cPathInterface &) = default;
  cPathInterface &operator=(const cPathInterface &) = default;
};

}  // namespace kvpath

#endif
