// The one clean-up that every directory text gets.
#ifndef KVSVAPI_PATHS_NORMALIZE_DIRECTORY_TEXT_H
#define KVSVAPI_PATHS_NORMALIZE_DIRECTORY_TEXT_H

#include <string>

namespace ovsysq {

// Drops white space, '/' and NUL from the end, then white space from the start. "/" becomes "",
// so the root directory has no text of its own at this layer.
void NormalizeDirectoryText(std::string &text);

}  // namespace ovsysq

#endif
