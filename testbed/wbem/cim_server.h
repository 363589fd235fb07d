// Answers CIM-XML requests.
#pragma once

#include <optional>
#include <string>

#include "credentials.h"
#include "http_message.h"
#include "object_manager.h"
#include "operations.h"
#include "server_faults.h"

namespace testbed {

class CimServer {
public:
    /// `manager` must outlive the server. Without credentials everybody may ask. `host` is told in
    /// paths when the client does not say what it calls the server.
    CimServer(const ObjectManager& manager, std::string host,
              std::optional<Credentials> credentials = {})
        : manager_(manager), host_(std::move(host)), credentials_(std::move(credentials)) {}

    /// From now on the answers are as those say that `faults` has; it must outlive the server.
    void failBy(ServerFaults& faults) { faults_ = &faults; }

    /// Thread-safe. Does not throw but for lack of memory. What needs the provider is slow work,
    /// which the server must outlive.
    HttpOutcome answer(const HttpRequest& request) const;

private:
    HttpOutcome answerCall(const HttpRequest& request) const;
    HttpResponse answerTo(const CimRequest& request, const std::string& host,
                          const std::optional<ServerFault>& fault) const;
    void carryOut(const CimRequest& request, const std::string& host, pugi::xml_node result) const;

    const ObjectManager& manager_;
    std::string host_;
    std::optional<Credentials> credentials_;
    ServerFaults* faults_ = nullptr;
};

}  // namespace testbed
