/* The convenience layer as inline functions. */
#define FORM InlineForm

#include "forwarders_test.h"
#include "helpers_test.h"
