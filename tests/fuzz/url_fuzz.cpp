// The address of a WBEM server, as users write it.
#include "fuzz_target.h"
#include "wbem_url.h"

using testbed::parseWbemUrl;
using testbed::WbemError;
using testbed::WbemUrl;

PLEXOR_FUZZ_HARNESS(url) {
    try {
        const WbemUrl url = parseWbemUrl(std::string(bytes));
        fuzz::require(!url.host.empty(), "a URL names a host");
        fuzz::require(url.port != 0, "a URL has a port");
        fuzz::require(!url.hasPassword || url.credentials, "a password has a user");
        // Host and port as the header has them name the same server.
        const WbemUrl again = parseWbemUrl("http://" + url.authority());
        fuzz::require(again.host == url.host && again.port == url.port,
                      "the authority names the server");
    } catch (const WbemError& error) {
        fuzz::require(*error.what() != '\0', "a refusal has a text");
    }
}
