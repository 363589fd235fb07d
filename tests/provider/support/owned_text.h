// Changing the texts of records that tests make by hand.
#pragma once

#include <stdlib.h>

#include "records.h"

namespace plexortest {

/// Replaces an owned text of a record; null for none.
inline void setText(char*& field, const char* text) {
    free(field);
    field = ownedCopy(text);
}

}  // namespace plexortest
