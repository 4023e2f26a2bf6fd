// The maker's share directory, named by a file that the installation writes.
#ifndef KVSVAPI_PATHS_SHARE_DIR_H
#define KVSVAPI_PATHS_SHARE_DIR_H

#include <string>

namespace ovsysq {

extern const char kShareDirFile[];     // "/etc/orvane/share/share.dir"
extern const char kShareDirDefault[];  // "/usr/local/orvane/share"

// The normalised content of `fileName`, read afresh at each call; a file that is missing,
// unreadable or short gives kShareDirDefault, silently.
std::string ReadShareDir(const char *fileName);

}  // namespace ovsysq

#endif
