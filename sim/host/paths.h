// Host paths: records that hold a path text, and the application's own path.
#ifndef SVHOST_PATHS_H
#define SVHOST_PATHS_H

namespace svhost {

// The application path goes back to the directory of the running executable.
void ResetAppPath();

}  // namespace svhost

#endif
