// Who may see a page, and who may press its buttons.
#pragma once

#include <optional>
#include <string>

#include "credentials.h"
#include "http_message.h"

namespace testbed {

/// Thread-safe.
class PageAccess {
public:
    /// `host` is this host's name. Without credentials everybody may look.
    PageAccess(std::string host, bool isSecure, std::optional<Credentials> credentials);

    /// The status that refuses a request for a page: 401; 421 for a name that is not this host's,
    /// as other sites can make it their own; 403 for a request that another site has caused. 0 for
    /// one that is welcome.
    int refusalOf(const HttpRequest& request) const;
    /// Whether the client may give commands: with the right password, or without any from this
    /// host, under one of its loopback names.
    bool maySteer(const HttpRequest& request) const;
    /// The same for a command, which a page of this server must have sent: the Origin is the
    /// server's own, and the token is right.
    bool isOwnCommand(const HttpRequest& request) const;
    /// What a page that may steer sends along; made anew at each start.
    const std::string& token() const { return token_; }

private:
    bool isAuthorizedClient(const HttpRequest& request) const;

    std::string host_;
    bool isSecure_;
    std::optional<Credentials> credentials_;
    std::string token_;
};

/// Its header.
inline constexpr const char* kTokenHeader = "X-Plexor-Token";

}  // namespace testbed
