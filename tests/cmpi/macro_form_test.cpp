/* The convenience layer as macros. */
#define CMPI_NO_INLINE
#define FORM MacroForm

#include "forwarders_test.h"
#include "helpers_test.h"
