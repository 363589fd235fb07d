/* The same checks in the other language. */
#include "uses.c"
