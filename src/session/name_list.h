// Names of a session's list, cut from the driver's comma-separated text and kept on the slot.
#ifndef KVSVAPI_SESSION_NAME_LIST_H
#define KVSVAPI_SESSION_NAME_LIST_H

#include <cstddef>
#include <string>
#include <vector>

namespace nKVSVAPI100 {

class cNameList {
 public:
  // Cuts at each ',' and drops empty tokens; a null text leaves the list invalid and empty.
  explicit cNameList(const char *text);

  // Position of the first entry equal to `text`, else of the first entry whose part before its
  // first '.' equals it; -1 for no match, an invalid list, a null text or a length under 1.
  int Find(const char *text, std::ptrdiff_t length) const;

  bool Valid() const { return valid_; }
  const std::vector<std::string> &Names() const { return names_; }

  // Trims white space from both ends, then cuts at the first blank or newline, so that of a
  // reference string only the object name stays.
  static std::string NormalizeName(const std::string &name);

 private:
  std::vector<std::string> names_;
  bool valid_ = false;
};

}  // namespace nKVSVAPI100

#endif
