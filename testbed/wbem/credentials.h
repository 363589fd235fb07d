// Who may ask: HTTP's Basic authentication.
#pragma once

#include <string>

namespace testbed {

struct Credentials {
    std::string user;
    std::string password;
};

/// True when the value of a header Authorization names the user and the password. Takes as long
/// for a wrong one as for the right one of the same size.
bool isAuthorized(const std::string& header, const Credentials& expected);

/// The file's first line. Throws std::runtime_error when it cannot be read or is empty.
std::string readPassword(const std::string& file);

}  // namespace testbed
