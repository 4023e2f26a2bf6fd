// The by-name removal of references, in a library of its own: a host may lack it, and a program
// links this library only to have a host that offers it.
#include "svsim.h"

extern "C" int32_t svUnregisterRefByName(SvHandle name, SvHandle kind, SvHandle className,
                                         int32_t c21) {
  return svsimUnregisterRefByName(name, kind, className, c21);
}
