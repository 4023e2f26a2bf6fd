// Exports that the host's references of the library call for bookkeeping of their own: they
// stand for no driver session.
#include "kvsvapi.h"
#include "kvsvplatform.h"

namespace {

// The handle of the internal session, which the driver never hands out.
constexpr uint32_t kInternalSession = 0xDEADFAB4;

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionInternalOpen(SvHandle * /*name*/, uint32_t *session) {
  if (session != nullptr) *session = kInternalSession;
  return 0;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionInternalClose(void) { return 0; }

extern "C" KVSV_EXPORT kvsvStatus kvsvInternalHandleToRef(void * /*reserved1*/, SvHandle *source,
                                                          void * /*reserved2*/, SvHandle *target) {
  if (source == nullptr) return kvErrNullArgument;
  return svCopyHandle(target, *source);
}
