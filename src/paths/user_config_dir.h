// The user's configuration directory.
#ifndef KVSVAPI_PATHS_USER_CONFIG_DIR_H
#define KVSVAPI_PATHS_USER_CONFIG_DIR_H

#include <string>

#include "paths/ovsysq_status.h"

namespace ovsysq {

// XDG_CONFIG_HOME as it stands (normalised), made with its parents when `create` is set; else the
// home directory (HOME, or the password entry) with "/.config", of which `create` makes only the
// last directory, so that a home that doesn't exist is a failure rather than a new tree.
std::string UserConfigDir(bool create, tJsonStatus &status);

}  // namespace ovsysq

#endif
