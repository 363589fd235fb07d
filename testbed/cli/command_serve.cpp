// Running the server: provider, CIM-XML, page and control socket, and commands meanwhile.
#include "command_serve.h"

#include <poll.h>
#include <signal.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <filesystem>
#include <iostream>
#include <memory>

#include "access.h"
#include "cim_server.h"
#include "command_queue.h"
#include "control_socket.h"
#include "descriptor_limit.h"
#include "host_name.h"
#include "http_server.h"
#include "input_lines.h"
#include "live_session.h"
#include "page_about.h"
#include "page_server.h"
#include "provider_log.h"
#include "server_faults.h"
#include "stop_signals.h"
#include "tree_view.h"
#include "wait_ender.h"
#include "whole_line.h"

namespace testbed {
namespace {

struct ServeOptions {
    LiveOptions live;
    HttpServerOptions http;
    std::string control;
    AccessOptions access;
    std::string page = "steer";
    std::string certificate;
    std::string key;
    bool selfSigned = false;
    bool log = false;
};

/// Beside connections: files, the provider's and those of the system's libraries.
constexpr std::size_t kOtherDescriptors = 64;

Registration registrationOf(ProviderSession& session) {
    Registration registration{session.client(), kServedNamespace, {}};
    for (const ServedClass& served : servedClasses()) {
        registration.classes.emplace_back(served.name);
    }
    return registration;
}

class Serve : private LiveSession {
public:
    Serve(const ServeOptions& options, std::optional<Credentials> credentials,
          const StopSignals& signals)
        : LiveSession(options.live),
          signals_(signals),
          manager_(session().repository(), registrationOf(session()), hostName()),
          cim_(manager_, hostName(), credentials),
          feed_(pageSource(options)),
          page_(feed_, {hostName(), isSecure(options), std::move(credentials)}, steering(options)),
          http_(httpOptions(options),
                [this, withPage = options.page != "off"](const HttpRequest& request) {
                    auto outcome = withPage ? page_.answer(request) : std::nullopt;
                    return outcome ? std::move(*outcome) : cim_.answer(request);
                }),
          control_(options.control),
          url_(urlOf(options)) {
        // Nobody asks for the calls, and there is no end to them.
        session().broker().books().keepCalls(false);
        cim_.failBy(faults_);
        printer().tell([this](const std::string& line) {
            if (line.starts_with("> ") || line.starts_with("[")) feed_.note(line);
        });
    }

    /// False when a refused command has ended it.
    bool run() {
        feed_.simulate(simulatedArray(array(), clock()));
        printer().line("serving " + url_);
        while (!signals_.arrived() && passTime() && takeCommands()) {
            takeNewFile();
            feed_.simulate(simulatedArray(array(), clock()));
        }
        return !hasFailed();
    }

    /// Requests that a fault keeps waiting would keep the server from ending.
    ~Serve() override {
        session().broker().faults().endWaits();
        printer().tell(nullptr);
        pageCommands_.close();
        feed_.stop();
    }

private:
    static bool isSecure(const ServeOptions& options) {
        return !options.certificate.empty() || options.selfSigned;
    }

    PageSource pageSource(const ServeOptions& options) {
        const std::string name = std::filesystem::path(options.live.scenario).stem().string();
        return {.ask =
                    [this] {
                        return Answers{ask(), "", "", 0};
                    },
                .about = pageAbout("simulated array " + name, options.page == "steer")};
    }

    /// Commands of pages wait for the thread that the array belongs to.
    PageServer::CarryOut steering(const ServeOptions& options) {
        if (options.page != "steer") return nullptr;
        return [this](const std::string& line) { return pageCommands_.submit(line); };
    }

    HttpServerOptions httpOptions(const ServeOptions& options) {
        HttpServerOptions http = options.http;
        http.welcome = [this] { return faults_.welcome(); };
        if (!options.certificate.empty()) {
            http.tls = tlsFromFiles(options.certificate, options.key);
        } else if (options.selfSigned) {
            http.tls = tlsSelfSigned(hostName());
        }
        raiseDescriptorLimit(http.connections + kOtherDescriptors);
        return http;
    }

    std::string urlOf(const ServeOptions& options) const {
        const std::string& address = options.http.address;
        const bool isIpv6 = address.find(':') != std::string::npos;
        return (isSecure(options) ? "https://" : "http://") +
               (isIpv6 ? "[" + address + "]" : address) + ":" + std::to_string(http_.port()) +
               "/cimom";
    }

    /// "server NAME=VALUE..." and "clear server".
    bool executeOwn(const std::string& line) override {
        constexpr std::string_view kVerb = "server ";
        if (line == "clear server") {
            faults_.clear();
        } else if (line.starts_with(kVerb)) {
            faults_.add(parseServerFault(std::string_view(line).substr(kVerb.size())));
        } else {
            return false;
        }
        http_.listen(!faults_.refusesConnections());
        return true;
    }

    /// Waits a second at most for commands and carries them out. False when one ends the server.
    bool takeCommands() {
        const bool listens = std::chrono::steady_clock::now() >= inputResumes_;
        std::vector<pollfd> sources = {{listens ? input_.descriptor() : -1, POLLIN, 0},
                                       {signals_.descriptor(), POLLIN, 0},
                                       {pageCommands_.descriptor(), POLLIN, 0}};
        control_.watch(sources);
        const auto limit = pause(std::chrono::seconds(1));
        poll(sources.data(), sources.size(), static_cast<int>(limit.count()));
        if (sources[0].revents != 0) input_.receive();
        pageCommands_.attend([this](const auto& line) { return carryOut(line); });
        return takeInput() && control_.attend([this](const auto& line) { return carryOut(line); });
    }

    bool takeInput() {
        while (std::chrono::steady_clock::now() >= inputResumes_) {
            const auto line = input_.take();
            if (!line) return true;
            if (!execute(*line)) return false;
        }
        return true;
    }

    std::string tree() override { return treeView(ask()); }

    void wait(int seconds) override {
        inputResumes_ = std::chrono::steady_clock::now() + std::chrono::seconds(seconds);
    }

    const StopSignals& signals_;
    InputLines input_{InputLines::Pipe::Reopens};
    ServerFaults faults_;
    ObjectManager manager_;
    CimServer cim_;
    CommandQueue pageCommands_;
    PageFeed feed_;
    PageServer page_;
    HttpServer http_;
    ControlSocket control_;
    std::string url_;
    std::chrono::steady_clock::time_point inputResumes_{};
};

bool serve(const ServeOptions& options) {
    StopSignals signals;
    // Whoever reads the lines may go away; the clients stay.
    signal(SIGPIPE, SIG_IGN);
    showProviderLog(options.log);
    AccessOptions access = options.access;
    access.address = options.http.address;
    auto credentials = accessOf(access);
    if (!credentials && isPublic(access.address)) {
        printLine(std::cerr,
                  "plexor-testbed: warning: everybody who reaches " + access.address + " may ask");
    }
    WaitEnder ender(signals);
    ServeOptions watched = options;
    watched.live.onBroker = [&ender](Broker& broker) { ender.watch(&broker.faults()); };
    Serve server(watched, std::move(credentials), signals);
    const bool succeeded = server.run();
    ender.watch(nullptr);
    // A provider that does not return keeps the server from ending.
    signals.letNextOneEnd();
    return succeeded;
}

/// Where the server's certificate comes from.
void addTlsOptions(CLI::App& command, ServeOptions& options) {
    CLI::Option* certificate = command.add_option(
        "--cert", options.certificate, "serve HTTPS with the certificate in this PEM file");
    CLI::Option* key =
        command.add_option("--key", options.key, "PEM file with the certificate's key");
    certificate->needs(key);
    key->needs(certificate);
    command
        .add_flag("--tls-self-signed", options.selfSigned,
                  "serve HTTPS with a certificate that is made now and thrown away at the end")
        ->excludes(certificate);
}

}  // namespace

void addServeCommand(CLI::App& app, int& status) {
    const auto options = std::make_shared<ServeOptions>();
    CLI::App* command = app.add_subcommand(
        "serve",
        "Answers WBEM clients over HTTP (CIM-XML) until it gets a signal or the command quit; "
        "takes the commands of watch on standard input");
    addLiveOptions(*command, options->live);
    command->add_option("--listen", options->http.address, "numeric address to listen on")
        ->capture_default_str();
    command->add_option("--port", options->http.port, "port to listen on; 0: any that is free")
        ->capture_default_str();
    CLI::Option* user = command->add_option("--user", options->access.user,
                                            "the only user who may ask (default: anybody)");
    CLI::Option* file = command->add_option("--password-file", options->access.passwordFile,
                                            "file whose first line is the user's password");
    user->needs(file);
    file->needs(user);
    command->add_flag("--insecure-public", options->access.insecurePublic,
                      "let everybody ask on an address that other hosts reach");
    addTlsOptions(*command, *options);
    command->add_option("--interval", options->live.intervalSeconds,
                        "the provider's polling interval in seconds");
    command->add_option("--control", options->control,
                        "socket on which plexor-testbed tell gives commands");
    command
        ->add_option("--page", options->page,
                     "the page at /: steer, with buttons for the commands; look, without; off")
        ->check(CLI::IsMember({"steer", "look", "off"}))
        ->capture_default_str();
    command->add_flag("--log", options->log, "print the provider's log lines on standard error");
    command->callback([options, user, &status] {
        options->access.isUserGiven = user->count() > 0;
        status = serve(*options) ? 0 : 1;
    });
}

}  // namespace testbed
