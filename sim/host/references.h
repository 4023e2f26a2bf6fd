// The host's reference manager: named references that a library registers for its objects, each
// with the export that closes it when the program that holds it stops.
#ifndef SVHOST_REFERENCES_H
#define SVHOST_REFERENCES_H

#include <cstdint>
#include <string>
#include <vector>

namespace svhost {

struct Reference {
  uint64_t cookie = 0;
  uint32_t handle = 0;
  int32_t keep = 0;
  std::string name;
  std::string kind;
  std::string className;
  std::string libraryPattern;
  std::string openName;
  std::string closeName;
};

// Removes every registered reference and gives them in order of registration.
std::vector<Reference> TakeAllReferences();

// Forgets every reference and the forced status.
void ResetReferences();

}  // namespace svhost

#endif
