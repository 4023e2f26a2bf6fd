// Where the project session file lies.
#ifndef KVSVAPI_SESSION_SESSION_FILE_PATH_H
#define KVSVAPI_SESSION_SESSION_FILE_PATH_H

#include <string>

#include "core/status.h"

namespace nKVSVAPI100 {

// The name of the project session file, wherever it lies.
constexpr char kSessionFileName[] = "kvorSession.txt";

// In a built application the file lies beside the application, otherwise in the driver's
// directory for temporary session text files. `path` is set only on success. A host path
// failure or a directory that cannot be computed is reported (file 14) and gives 0xBFF63001;
// out of memory 0xBFF63010.
Status GetSessionFilePath(std::string &path);

}  // namespace nKVSVAPI100

#endif
