// Where a manager offers the flush: in the context's table, or as a function of its own.
#include "broker_options.h"

#include <cmpift.h>

namespace testbed {

namespace {

#if defined(PLEXOR_CONTEXT_FLUSH) && PLEXOR_CONTEXT_FLUSH
constexpr bool kTableHasFlush = true;
#else
constexpr bool kTableHasFlush = false;
#endif

}  // namespace

bool BrokerOptions::hasContextFlush() const {
    return kTableHasFlush && flush == FlushOffer::ContextEntry;
}

bool BrokerOptions::exportsFlush() const {
    if (flush == FlushOffer::ContextEntry) return !kTableHasFlush;
    return flush == FlushOffer::OwnFunction;
}

}  // namespace testbed
