// Decoding and comparing the header, and reading a password from its file.
#include "credentials.h"

#include <cerrno>
#include <fstream>
#include <optional>
#include <stdexcept>
#include <string_view>
#include <system_error>

#include "cim_object.h"

namespace testbed {
namespace {

constexpr std::string_view kDigits =
    "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

std::optional<std::string> fromBase64(std::string_view text) {
    while (text.ends_with('=')) text.remove_suffix(1);
    std::string bytes;
    unsigned bits = 0;
    int count = 0;
    for (const char c : text) {
        const std::size_t digit = kDigits.find(c);
        if (digit == std::string_view::npos) return std::nullopt;
        bits = (bits << 6) | static_cast<unsigned>(digit);
        count += 6;
        if (count < 8) continue;
        count -= 8;
        bytes += static_cast<char>((bits >> count) & 0xff);
    }
    return bytes;
}

/// Looks at every byte, however early the first difference is.
bool equalInConstantTime(std::string_view given, std::string_view expected) {
    unsigned difference = given.size() == expected.size() ? 0 : 1;
    for (std::size_t i = 0; i < given.size(); i++) {
        const char other = expected.empty() ? '\0' : expected[i % expected.size()];
        difference |= static_cast<unsigned char>(given[i] ^ other);
    }
    return difference == 0;
}

}  // namespace

bool isAuthorized(const std::string& header, const Credentials& expected) {
    constexpr std::string_view kScheme = "Basic ";
    if (!sameName(header.substr(0, kScheme.size()), kScheme)) return false;
    const auto given = fromBase64(std::string_view(header).substr(kScheme.size()));
    return given && equalInConstantTime(*given, expected.user + ":" + expected.password);
}

std::string readPassword(const std::string& file) {
    errno = 0;
    std::ifstream stream(file);
    std::string password;
    std::getline(stream, password);
    if (!stream && errno != 0) {
        throw std::runtime_error("no password in " + file + ": " +
                                 std::generic_category().message(errno));
    }
    if (password.ends_with('\r')) password.pop_back();
    if (password.empty()) {
        throw std::runtime_error("no password in " + file + ": its first line is empty");
    }
    return password;
}

}  // namespace testbed
