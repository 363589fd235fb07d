// Telling loopback addresses from public ones, and insisting on a user where others can ask.
#include "access.h"

#include <boost/asio/ip/address.hpp>
#include <stdexcept>

namespace testbed {

bool isPublic(const std::string& address) {
    boost::system::error_code error;
    const auto parsed = boost::asio::ip::make_address(address, error);
    if (error) return false;
    if (!parsed.is_v6() || !parsed.to_v6().is_v4_mapped()) return !parsed.is_loopback();
    return !make_address_v4(boost::asio::ip::v4_mapped, parsed.to_v6()).is_loopback();
}

std::optional<Credentials> accessOf(const AccessOptions& options) {
    if (options.isUserGiven) {
        if (options.user.empty()) throw std::runtime_error("--user has no name");
        if (options.user.find(':') != std::string::npos) {
            throw std::runtime_error("--user: a name with a colon cannot be sent");
        }
        return Credentials{options.user, readPassword(options.passwordFile)};
    }
    if (!isPublic(options.address) || options.insecurePublic) return std::nullopt;
    throw std::runtime_error("everybody who reaches " + options.address +
                             " could ask; name a --user, or say --insecure-public");
}

}  // namespace testbed
