// The database reads, where tests of other areas look for them.
#include "support/database_reads.h"
