// Giving back a thread's broker objects.
#include "PlexorProviderUtil.h"

#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH

void FlushContext(CMPIContext* ctx) {
    if (ctx != nullptr) ctx->ft->flush(ctx);
}

#else

// Standard managers have no flush in their context table. One of them exports this function, which
// does the same for the calling thread; elsewhere the weak reference stays null.
extern "C" void tool_mm_flush(void) __attribute__((weak));

void FlushContext(CMPIContext* ctx) {
    if (ctx != nullptr && tool_mm_flush != nullptr) tool_mm_flush();
}

#endif
