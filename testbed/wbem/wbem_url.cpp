// Taking a URL apart: scheme, credentials, host, port and namespace.
#include "wbem_url.h"

#include <algorithm>
#include <charconv>
#include <string_view>

namespace testbed {
namespace {

constexpr unsigned short kHttpsPort = 5989;
constexpr std::string_view kServersOwnPath = "cimom";

[[noreturn]] void refuse(const std::string& why) {
    // The text itself is left out: it may hold a password.
    throw WbemError("the URL " + why +
                    "; it looks like http://[user:password@]host[:5988][/root/cimv2]");
}

/// Removes the prefix, without regard to case. False when the text begins otherwise.
bool takePrefix(std::string_view& text, std::string_view prefix) {
    const auto equal = [](char a, char b) { return (a >= 'A' && a <= 'Z' ? a + 32 : a) == b; };
    if (text.size() < prefix.size() || !std::equal(prefix.begin(), prefix.end(), text.begin(),
                                                   [&](char b, char a) { return equal(a, b); })) {
        return false;
    }
    text.remove_prefix(prefix.size());
    return true;
}

std::string percentDecoded(std::string_view text) {
    std::string decoded;
    while (!text.empty()) {
        unsigned byte = 0;
        if (text[0] != '%') {
            decoded += text[0];
            text.remove_prefix(1);
            continue;
        }
        const std::string_view digits = text.substr(1, 2);
        const auto [stop, error] =
            std::from_chars(digits.data(), digits.data() + digits.size(), byte, 16);
        if (error != std::errc() || stop != digits.data() + 2) refuse("has a bad %");
        decoded += static_cast<char>(byte);
        text.remove_prefix(3);
    }
    return decoded;
}

Credentials credentialsIn(std::string_view text) {
    const std::size_t colon = std::min(text.find(':'), text.size());
    return {percentDecoded(text.substr(0, colon)),
            colon < text.size() ? percentDecoded(text.substr(colon + 1)) : ""};
}

unsigned short portIn(std::string_view text) {
    unsigned short port = 0;
    const char* end = text.data() + text.size();
    const auto [stop, error] = std::from_chars(text.data(), end, port);
    if (error != std::errc() || stop != end || port == 0) refuse("has a bad port");
    return port;
}

/// Splits "host", "host:port", "[v6]" and "[v6]:port".
void readAuthority(std::string_view text, WbemUrl& url) {
    std::string_view rest;
    if (text.starts_with('[')) {
        const std::size_t bracket = text.find(']');
        if (bracket == std::string_view::npos) refuse("has no ] behind its address");
        url.host = text.substr(1, bracket - 1);
        rest = text.substr(bracket + 1);
    } else {
        const std::size_t colon = std::min(text.find(':'), text.size());
        url.host = text.substr(0, colon);
        rest = text.substr(colon);
    }
    if (url.host.empty()) refuse("names no host");
    if (rest.empty()) return;
    if (!rest.starts_with(':')) refuse("has a bad port");
    url.port = portIn(rest.substr(1));
}

bool isPrintable(std::string_view text) {
    return std::all_of(text.begin(), text.end(), [](char c) { return c > ' ' && c < 0x7f; });
}

/// The namespace that the part behind the host names; "" for the server's own path and for none.
std::string namespaceIn(std::string_view path) {
    if (path.find_first_of("?#") != std::string_view::npos) {
        refuse(
            "has a ? or # behind its host; in a user name or password, /, ? and # are written "
            "%2F, %3F and %23");
    }
    while (path.starts_with('/')) path.remove_prefix(1);
    while (path.ends_with('/')) path.remove_suffix(1);
    if (path == kServersOwnPath) return "";
    const std::string nameSpace = percentDecoded(path);
    if (nameSpace.find(':') != std::string::npos) {
        refuse("names a class behind its namespace, which --class does");
    }
    if (!isPrintable(nameSpace)) refuse("has a namespace with blanks or control characters");
    return nameSpace;
}

}  // namespace

std::string WbemUrl::authority() const {
    const bool isV6 = host.find(':') != std::string::npos;
    return (isV6 ? "[" + host + "]" : host) + ":" + std::to_string(port);
}

WbemUrl parseWbemUrl(const std::string& text) {
    std::string_view rest = text;
    WbemUrl url;
    if (!isPrintable(rest)) refuse("has a blank or another character that a URL cannot have");
    if (takePrefix(rest, "https://")) {
        url.tls = true;
        url.port = kHttpsPort;
    } else if (!takePrefix(rest, "http://")) {
        refuse("begins neither with http:// nor with https://");
    }
    std::string_view authority = rest.substr(0, rest.find_first_of("/?#"));
    const std::string_view path = rest.substr(authority.size());
    if (const std::size_t at = authority.rfind('@'); at != std::string_view::npos) {
        const std::string_view userInfo = authority.substr(0, at);
        url.credentials = credentialsIn(userInfo);
        url.hasPassword = userInfo.find(':') != std::string_view::npos;
        authority.remove_prefix(at + 1);
    }
    readAuthority(authority, url);
    url.nameSpace = namespaceIn(path);
    return url;
}

}  // namespace testbed
