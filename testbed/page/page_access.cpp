// Checking a request's host, origin, credentials and token.
#include "page_access.h"

#include <openssl/crypto.h>
#include <openssl/rand.h>

#include <boost/asio/ip/address.hpp>
#include <stdexcept>
#include <string_view>

#include "access.h"
#include "cim_object.h"

namespace testbed {
namespace {

std::string randomToken() {
    unsigned char bytes[16];
    if (RAND_bytes(bytes, sizeof bytes) != 1) throw std::runtime_error("no random numbers");
    std::string token;
    for (const unsigned char byte : bytes) {
        for (const int digit : {byte >> 4, byte & 15}) token += "0123456789abcdef"[digit];
    }
    return token;
}

/// The name in "name:port" and "[::1]:port"; "" where there is none.
std::string nameIn(const std::string& host) {
    if (!host.starts_with('[')) return host.substr(0, host.find(':'));
    const std::size_t end = host.find(']');
    return end == std::string::npos ? "" : host.substr(1, end - 1);
}

bool isAddress(const std::string& name) {
    boost::system::error_code error;
    boost::asio::ip::make_address(name, error);
    return !error;
}

/// A name that nobody else can make point to this host.
bool isLoopbackName(const std::string& name) {
    return sameName(name, "localhost") || (isAddress(name) && !isPublic(name));
}

bool isEqualInConstantTime(const std::string& left, const std::string& right) {
    return left.size() == right.size() &&
           CRYPTO_memcmp(left.data(), right.data(), left.size()) == 0;
}

std::string headerOf(const HttpRequest& request, const char* name) {
    const std::string* value = request.header(name);
    return value ? *value : "";
}

}  // namespace

PageAccess::PageAccess(std::string host, bool isSecure, std::optional<Credentials> credentials)
    : host_(std::move(host)),
      isSecure_(isSecure),
      credentials_(std::move(credentials)),
      token_(randomToken()) {}

bool PageAccess::isAuthorizedClient(const HttpRequest& request) const {
    return !credentials_ || isAuthorized(headerOf(request, "Authorization"), *credentials_);
}

int PageAccess::refusalOf(const HttpRequest& request) const {
    const std::string name = nameIn(headerOf(request, "Host"));
    if (!isLoopbackName(name) && !isAddress(name) && !sameName(name, host_)) return 421;
    if (!isAuthorizedClient(request)) return 401;
    // Whoever follows a link to the page comes from elsewhere; nothing else of it is for others.
    const std::string site = headerOf(request, "Sec-Fetch-Site");
    const bool isElsewhere = site == "cross-site" || site == "same-site";
    return isElsewhere && headerOf(request, "Sec-Fetch-Mode") != "navigate" ? 403 : 0;
}

bool PageAccess::maySteer(const HttpRequest& request) const {
    if (credentials_) return isAuthorizedClient(request);
    return request.isFromThisHost && isLoopbackName(nameIn(headerOf(request, "Host")));
}

bool PageAccess::isOwnCommand(const HttpRequest& request) const {
    const std::string own = (isSecure_ ? "https://" : "http://") + headerOf(request, "Host");
    return maySteer(request) && sameName(headerOf(request, "Origin"), own) &&
           isEqualInConstantTime(headerOf(request, kTokenHeader), token_);
}

}  // namespace testbed
