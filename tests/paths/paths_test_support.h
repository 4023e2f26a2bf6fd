// The temporary directories and scoped environment variables that the path tests, the driver
// stand-in's and the session tests use.
#ifndef KVSVAPI_TESTS_PATHS_PATHS_TEST_SUPPORT_H
#define KVSVAPI_TESTS_PATHS_PATHS_TEST_SUPPORT_H

#include "support/scoped_env.h"
#include "support/temp_dir.h"

#endif
