#include "session/name_list.h"

#include <cctype>

#include <boost/tokenizer.hpp>

namespace nKVSVAPI100 {

cNameList::cNameList(const char *text) {
  if (text == nullptr) return;
  const std::string source(text);
  const boost::char_separator<char> comma(",");
  for (const std::string &token : boost::tokenizer<boost::char_separator<char>>(source, comma))
    names_.push_back(NormalizeName(token));
  valid_ = true;
}

std::string cNameList::NormalizeName(const std::string &name) {
  std::size_t begin = 0;
  std::size_t end = name.size();
  while (begin < end && std::isspace(static_cast<unsigned char>(name[begin]))) ++begin;
  while (end > begin && std::isspace(static_cast<unsigned char>(name[end - 1]))) --end;
  const std::size_t cut = name.find_first_of(" \n", begin);
  if (cut != std::string::npos && cut < end) end = cut;
  return name.substr(begin, end - begin);
}

int cNameList::Find(const char *text, std::ptrdiff_t length) const {
  if (!valid_ || text == nullptr || length < 1) return -1;
  const std::string wanted = NormalizeName(std::string(text, static_cast<std::size_t>(length)));
  for (std::size_t i = 0; i < names_.size(); ++i)
    if (names_[i] == wanted) return static_cast<int>(i);
  // A frame may be named without its qualifying prefix.
  for (std::size_t i = 0; i < names_.size(); ++i) {
    const std::size_t dot = names_[i].find('.');
    if (dot != std::string::npos && names_[i].compare(0, dot, wanted) == 0)
      return static_cast<int>(i);
  }
  return -1;
}

}  // namespace nKVSVAPI100
