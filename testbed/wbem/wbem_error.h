// What keeps a client from getting an answer of a WBEM server.
#pragma once

#include <stdexcept>

namespace testbed {

/// The server cannot be reached, does not speak CIM-XML, or not in time. The text is one line for
/// people. A server that answers with a CIM status is no such error.
struct WbemError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

}  // namespace testbed
