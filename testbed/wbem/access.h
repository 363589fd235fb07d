// Who may ask a server, and from where: what "serve" agrees to.
#pragma once

#include <optional>
#include <string>

#include "credentials.h"

namespace testbed {

struct AccessOptions {
    std::string user;                   ///< as said; see `isUserGiven`
    std::string passwordFile;           ///< file whose first line is the password
    bool isUserGiven = false;           ///< an empty name is no name
    std::string address = "127.0.0.1";  ///< numeric
    bool insecurePublic = false;        ///< serve everybody on every network, knowingly
};

/// The user who may ask; none when everybody may. Throws std::runtime_error for a user without a
/// name, a name that Basic authentication cannot carry, a file without a password, and for a server
/// that others than this host's users could reach and that asks nobody who they are.
std::optional<Credentials> accessOf(const AccessOptions& options);

/// True for an address that other hosts may reach; false for what is no address.
bool isPublic(const std::string& address);

}  // namespace testbed
