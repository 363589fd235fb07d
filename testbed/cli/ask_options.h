// The options of the command "ask" and of the plugin.
#pragma once

#include <optional>
#include <string>

#include "ask_server.h"
#include "check_command.h"
#include "colour.h"

namespace testbed {

struct AskOptions {
    std::string url;
    std::string host;
    unsigned short port = 0;  ///< 0: the usual one
    bool ssl = false;
    std::string path;       ///< "": the URL's
    std::string nameSpace;  ///< "": the URL's, or root/cimv2
    std::string className;
    std::string user;
    std::string passwordFile;
    TlsOptions tls;
    bool insecure = false;
    unsigned timeoutSeconds = 30;
    std::optional<double> refreshSeconds;
    bool noRefresh = false;
    bool json = false;
    bool metrics = false;
    bool problems = false;
    CheckOptions check;
    ColourChoice colour;
};

/// Adds those that tell which server to ask, and how. `options` must live until the command runs.
void addTargetOptions(CLI::App& command, AskOptions& options);

/// Adds all options. A plugin always checks. `options` must live until the command runs.
void addAskOptions(CLI::App& command, AskOptions& options, bool isPlugin);

/// Throws CLI::ParseError for options that do not go together, which the parser does not find.
void requireSense(const AskOptions& options);

/// What is to be asked, with the time from now. Throws WbemError or std::runtime_error for a URL,
/// a user or a file that cannot be used.
AskTarget targetOf(const AskOptions& options);

}  // namespace testbed
