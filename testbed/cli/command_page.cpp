// Serves the page over HTTP until a signal comes, and asks the WBEM server on its behalf.
#include "command_page.h"

#include <poll.h>
#include <signal.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "access.h"
#include "ask_options.h"
#include "host_name.h"
#include "http_server.h"
#include "page_about.h"
#include "page_server.h"
#include "stop_signals.h"
#include "whole_line.h"

namespace testbed {
namespace {

constexpr std::uint16_t kUsualPort = 5990;

struct PageOptions {
    AskOptions ask;
    HttpServerOptions http;
    double intervalSeconds = 5;
    bool insecurePublic = false;
};

Answers askNow(const AskOptions& options) {
    std::atomic<int> answered = 0;
    return askServer(targetOf(options), answered);
}

PageSource sourceOf(const PageOptions& options) {
    const std::string server = targetOf(options.ask).url.authority();
    return {.ask = [ask = options.ask] { return askNow(ask); },
            .pause = std::chrono::milliseconds(static_cast<long>(options.intervalSeconds * 1000)),
            .policy = options.ask.check.policy,
            .expected = options.ask.check.expected,
            .about = pageAbout(server, false)};
}

std::string urlOf(const HttpServerOptions& options, std::uint16_t port) {
    const bool isIpv6 = options.address.find(':') != std::string::npos;
    return "http://" + (isIpv6 ? "[" + options.address + "]" : options.address) + ":" +
           std::to_string(port) + "/";
}

/// Serves until a signal comes.
[[noreturn]] void show(const PageOptions& options) {
    requireSense(options.ask);
    if (isPublic(options.http.address) && !options.insecurePublic) {
        throw std::runtime_error("everybody who reaches " + options.http.address +
                                 " could look; say --insecure-public if they may");
    }
    signal(SIGPIPE, SIG_IGN);
    StopSignals signals;
    PageFeed feed(sourceOf(options));
    const PageServer page(feed, PageAccess(hostName(), false, std::nullopt));
    const HttpServer http(options.http, [&page](const HttpRequest& request) {
        auto outcome = page.answer(request);
        return outcome ? std::move(*outcome) : HttpOutcome(HttpResponse{404, {}, {}});
    });
    printLine(std::cout, "page at " + urlOf(options.http, http.port()));
    pollfd source = {signals.descriptor(), POLLIN, 0};
    while (poll(&source, 1, -1) < 0) {
    }
    // A server that does not answer must not keep the command from ending.
    _exit(0);
}

}  // namespace

void addPageCommand(CLI::App& app, int& /*status*/) {
    const auto options = std::make_shared<PageOptions>();
    options->http.port = kUsualPort;
    CLI::App* command = app.add_subcommand(
        "page", "Shows what a WBEM server answers as a page in the browser, to look at only");
    addTargetOptions(*command, options->ask);
    addJudgingOptions(*command, options->ask.check);
    command
        ->add_option("--interval", options->intervalSeconds,
                     "seconds between two askings while somebody looks")
        ->check(CLI::Range(0.1, 86400.0))
        ->capture_default_str();
    command->add_option("--listen", options->http.address, "numeric address of the page")
        ->capture_default_str();
    command->add_option("--listen-port", options->http.port, "the page's port; 0: any that is free")
        ->capture_default_str();
    command->add_flag("--insecure-public", options->insecurePublic,
                      "let everybody look on an address that other hosts reach");
    command->callback([options] { show(*options); });
}

}  // namespace testbed
