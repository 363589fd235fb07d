// An inventory from a WBEM server: everything that was asked for, or why not.
#pragma once

#include <atomic>
#include <optional>
#include <string>
#include <vector>

#include "inventory.h"
#include "wbem_client.h"

namespace testbed {

struct AskTarget {
    WbemUrl url;
    TlsOptions tls;
    std::vector<std::string> classNames;
    std::string nameSpace = "root/cimv2";
    Deadline deadline = Deadline::max();
    /// Ask once more after that time, and compare.
    std::optional<std::chrono::milliseconds> refresh;
};

/// What a server answered.
struct Answers {
    Inventory inventory;
    std::string failure;   ///< why there is not more; "" when there is all
    std::string arriving;  ///< what came or went between two askings; "" when nothing did
    double seconds = 0;    ///< that the asking took, the time between two askings left out
};

/// Asks for the classes one after the other, and again when `refresh` says so. An answer that has
/// an instance of another class or namespace, or the same one twice, is a failure. What the second
/// asking does not bring is left as the first one had it, together with the failure. `answered`
/// counts the answers meanwhile.
Answers askServer(const AskTarget& target, std::atomic<int>& answered);

}  // namespace testbed
