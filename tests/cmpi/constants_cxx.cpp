/* The same checks in the other language. */
#include "constants.c"
