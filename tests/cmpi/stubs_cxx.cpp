/* The same checks in the other language. */
#include "stubs.c"
