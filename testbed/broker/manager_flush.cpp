// The plain C function that some managers export for providers whose context table has no flush.
#include <cmpios.h>

#include "broker.h"

CMPI_EXTERN_C void tool_mm_flush();

void tool_mm_flush() {
    testbed::Broker::flushThreadEverywhere();
}
