// What no query of the provider narrows down.
#pragma once

#include "books.h"

namespace plexortest {

/// Whether a query asked along any role and for all properties.
inline bool asksForAll(const testbed::CallRecord& call) {
    return !call.role && !call.resultRole && !call.hasPropertyList;
}

}  // namespace plexortest
