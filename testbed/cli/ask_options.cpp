// The definitions of the options, and the address, credentials and classes that follow from them.
#include "ask_options.h"

#include <CLI/CLI.hpp>
#include <algorithm>

namespace testbed {
namespace {

constexpr const char* kDefaultNamespace = "root/cimv2";
/// Longer than the second that an inventory waits for room between two devices.
constexpr double kUsualRefresh = 3;

std::vector<std::string> classesToAsk(const std::string& className) {
    if (!className.empty()) return {className};
    std::vector<std::string> names;
    for (const ServedClass& served : servedClasses()) names.push_back(served.name);
    return names;
}

void addServerOptions(CLI::App& command, AskOptions& options) {
    CLI::Option* url =
        command.add_option("url", options.url, "http[s]://[user:password@]host[:port][/namespace]");
    CLI::Option* host =
        command.add_option("-H,--hostname", options.host, "the server's host, instead of a URL")
            ->excludes(url);
    command.add_option("-p,--port", options.port, "the server's port, with --hostname")
        ->check(CLI::Range(1, 65535))
        ->needs(host);
    command.add_flag("-S,--ssl", options.ssl, "https, with --hostname")->needs(host);
    command.add_option("--path", options.path, "where the server takes requests; /cimom");
    command.add_option("--namespace", options.nameSpace,
                       "namespace of the requests; the URL's, or root/cimv2");
}

void addConnectionOptions(CLI::App& command, AskOptions& options) {
    command.add_option("-u,--user", options.user, "user name, instead of the URL's");
    command.add_option("-P,--password-file", options.passwordFile,
                       "file whose first line is the password, instead of the URL's");
    command.add_option("-C,--ca-file", options.tls.authorities,
                       "certificates to trust, instead of the system's");
    command.add_flag("--insecure", options.insecure, "trust any certificate");
    command.add_option("-t,--timeout", options.timeoutSeconds, "seconds that all of it may take")
        ->check(CLI::Range(1, 86400))
        ->capture_default_str();
}

void addRefreshOptions(CLI::App& command, AskOptions& options) {
    CLI::Option* refresh =
        command
            .add_option("--refresh", options.refreshSeconds,
                        "ask again after so many seconds and compare; with --check 3 unless "
                        "--timeout is short")
            ->check(CLI::Range(0.0, 86400.0));
    command.add_flag("--no-refresh", options.noRefresh, "ask once, with --check, too")
        ->excludes(refresh);
}

void addViewOptions(CLI::App& command, AskOptions& options, bool isPlugin) {
    command.add_option("--class", options.className, "ask for this class only")
        ->check(CLI::IsMember(classesToAsk("")));
    CLI::Option* json = command.add_flag("--json", options.json, "print JSON");
    CLI::Option* check = addCheckOptions(command, options.check, isPlugin);
    if (isPlugin) return;
    CLI::Option* metrics =
        command.add_flag("--metrics", options.metrics, "print OpenMetrics text for a collector");
    metrics->excludes(json)->excludes(check);
    command.add_flag("--problems", options.problems, "show only what is not ok")
        ->excludes(json)
        ->excludes(check)
        ->excludes(metrics);
    addColourOption(command, options.colour);
}

WbemUrl addressOf(const AskOptions& options) {
    if (!options.url.empty()) return parseWbemUrl(options.url);
    const bool bareV6 = options.host.find(':') != std::string::npos && options.host[0] != '[';
    const std::string port = options.port ? ":" + std::to_string(options.port) : "";
    if (options.host.find_first_of("/@?#") != std::string::npos) {
        throw WbemError("--hostname is a name or an address and nothing else");
    }
    return parseWbemUrl((options.ssl ? "https://" : "http://") +
                        (bareV6 ? "[" + options.host + "]" : options.host) + port);
}

void setCredentials(const AskOptions& options, WbemUrl& url) {
    if (!options.user.empty()) {
        url.credentials = Credentials{options.user, ""};
        url.hasPassword = false;
    }
    if (!options.passwordFile.empty()) {
        if (!url.credentials) throw WbemError("a password, but no user; name one with --user");
        url.credentials->password = readPassword(options.passwordFile);
        url.hasPassword = true;
    }
    if (url.credentials && !url.hasPassword) {
        throw WbemError("a user, but no password; name its file with --password-file");
    }
}

/// The namespace that URL and option agree on.
std::string namespaceOf(const AskOptions& options, const WbemUrl& url) {
    if (options.nameSpace.empty()) return url.nameSpace.empty() ? kDefaultNamespace : url.nameSpace;
    if (!url.nameSpace.empty() && !sameName(url.nameSpace, options.nameSpace)) {
        throw WbemError("the URL names one namespace and --namespace another");
    }
    return options.nameSpace;
}

std::optional<std::chrono::milliseconds> refreshOf(const AskOptions& options) {
    if (options.noRefresh || (!options.refreshSeconds && !options.check.check)) return std::nullopt;
    const double usual = std::min(kUsualRefresh, options.timeoutSeconds / 4.0);
    const double seconds = options.refreshSeconds.value_or(usual);
    return std::chrono::milliseconds(static_cast<long>(seconds * 1000));
}

}  // namespace

void addTargetOptions(CLI::App& command, AskOptions& options) {
    addServerOptions(command, options);
    addConnectionOptions(command, options);
}

void addAskOptions(CLI::App& command, AskOptions& options, bool isPlugin) {
    addTargetOptions(command, options);
    addRefreshOptions(command, options);
    addViewOptions(command, options, isPlugin);
}

void requireSense(const AskOptions& options) {
    if (options.url.empty() && options.host.empty()) {
        throw CLI::RequiredError("a URL or --hostname");
    }
    if (options.refreshSeconds && *options.refreshSeconds >= options.timeoutSeconds) {
        throw CLI::ValidationError("--refresh", "must be shorter than --timeout");
    }
}

AskTarget targetOf(const AskOptions& options) {
    AskTarget target;
    target.deadline =
        std::chrono::steady_clock::now() + std::chrono::seconds(options.timeoutSeconds);
    target.url = addressOf(options);
    if (!options.path.empty()) target.url.path = options.path;
    setCredentials(options, target.url);
    target.tls = options.tls;
    target.tls.verify = !options.insecure;
    target.classNames = classesToAsk(options.className);
    target.nameSpace = namespaceOf(options, target.url);
    target.refresh = refreshOf(options);
    return target;
}

}  // namespace testbed
