// The Tesla signal sessions, where tests of other areas look for them.
#include "support/tesla_signals.h"
