/* The same checks in the other language. */
#include "layout.c"
