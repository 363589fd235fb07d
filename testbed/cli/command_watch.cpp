#include "command_watch.h"

#include <poll.h>
#include <sys/stat.h>
#include <syslog.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>
#include <mutex>

#include "inventory_changes.h"
#include "library_locator.h"
#include "live_array.h"
#include "polling_interval.h"
#include "provider_log.h"
#include "provider_session.h"
#include "scenario_parser.h"
#include "tree_view.h"

namespace testbed {
namespace {

constexpr int kProviderFailed = 3;
constexpr const char* kNameSpace = "root/cimv2";

struct WatchOptions {
    std::string scenario;
    std::string library;
    std::string provider = "PlexorProvider";
    unsigned intervalSeconds = 1;
    unsigned timeoutSeconds = 60;
    bool debug = false;
};

/// Lines of output, whole ones, whichever thread prints them.
class Printer {
public:
    void line(const std::string& text) {
        const std::lock_guard lock(mutex_);
        std::cout << text << std::endl;
    }

private:
    std::mutex mutex_;
};

std::vector<std::string> allClasses() {
    std::vector<std::string> names;
    for (const ServedClass& served : servedClasses()) names.push_back(served.name);
    return names;
}

/// Tells when a file has been written anew.
class FileWatch {
public:
    explicit FileWatch(std::string file) : file_(std::move(file)), seen_(stamp()) {}
    bool changed() {
        const auto now = stamp();
        return now != std::exchange(seen_, now);
    }

private:
    std::pair<long, long> stamp() const {
        struct stat status = {};
        if (stat(file_.c_str(), &status) != 0) return {0, 0};
        return {status.st_mtim.tv_sec, status.st_mtim.tv_nsec};
    }
    std::string file_;
    std::pair<long, long> seen_;
};

/// A client that polls, the array's commands, and the provider's log, in one stream of lines.
class Watch {
public:
    explicit Watch(const WatchOptions& options)
        : options_(options),
          polling_(options.intervalSeconds),
          file_(options.scenario),
          session_(
              readScenario(options.scenario).manager,
              [this](Broker& broker) {
                  array_ = std::make_unique<LiveArray>(broker, options_.scenario);
              },
              locateLibrary(options.library), options.provider) {}

    ~Watch() { directProviderLog(LOG_ERR, nullptr); }

    int run() {
        if (!session_.waitForInventory(std::chrono::seconds(options_.timeoutSeconds), kNameSpace)) {
            std::cerr << "plexor-testbed: the inventory is not complete after "
                      << options_.timeoutSeconds << " s\n";
            return kProviderFailed;
        }
        last_ = ask();
        printer_.line(treeView(last_));
        showLog();
        while (takeInput()) {
            if (file_.changed()) change([this] { array_->reload(); });
            poll();
        }
        return 0;
    }

private:
    Inventory ask() {
        InstanceClient client = session_.client();
        return collectInventory(client, allClasses(), kNameSpace);
    }

    void showLog() {
        directProviderLog(LOG_DEBUG, [this, all = options_.debug](int, const std::string& text) {
            if (all || tellsOfChange(text)) printer_.line("    log: " + text);
        });
    }

    /// Lines about devices that change, come or go.
    static bool tellsOfChange(const std::string& text) {
        if (text.starts_with("Data 0x")) return false;  // the lists' own tracing
        for (const char* part : {" changed. ", " pool changed, ", " removed from ", " deleted",
                                 " added to the list", "failed, status"})
            if (text.find(part) != std::string::npos) return true;
        return false;
    }

    void poll() {
        Inventory now = ask();
        for (const std::string& line : changeLines(last_, now)) printer_.line(line);
        last_ = std::move(now);
    }

    template <typename Change>
    void change(Change makeChange) {
        try {
            makeChange();
        } catch (const ScenarioError& error) {
            printer_.line(std::string("? ") + error.what());
        }
    }

    /// Carries out the command that arrives within an interval, if one does. False at the end.
    bool takeInput() {
        pollfd input = {STDIN_FILENO, POLLIN, 0};
        const bool ready = std::cin.rdbuf()->in_avail() > 0 ||
                           ::poll(&input, 1, static_cast<int>(1000 * options_.intervalSeconds)) > 0;
        if (!ready) return true;
        std::string line;
        if (!std::getline(std::cin, line) || line == "quit") return false;
        execute(line);
        return true;
    }

    void execute(const std::string& line) {
        if (line.empty() || line[0] == '#') return;
        if (line == "show") {
            printer_.line(treeView(last_));
        } else if (line.starts_with("wait ")) {
            wait(std::atoi(line.c_str() + 5));
        } else {
            printer_.line("> " + line);
            change([&] { array_->apply(line); });
        }
    }

    void wait(int seconds) {
        for (int i = 0; i < seconds; i++) {
            sleep(1);
            poll();
        }
    }

    WatchOptions options_;
    Printer printer_;
    PollingInterval polling_;
    FileWatch file_;
    std::unique_ptr<LiveArray> array_;
    ProviderSession session_;
    Inventory last_;
};

}  // namespace

void addWatchCommand(CLI::App& app, int& status) {
    const auto options = std::make_shared<WatchOptions>();
    CLI::App* command = app.add_subcommand(
        "watch",
        "Polls the provider while the array changes: by commands on standard input (set, add, "
        "remove, fail, rebuild, latency, fault, clear faults, wait N, show, quit) or by a new "
        "version of the scenario file");
    command->add_option("--scenario", options->scenario, "scenario file")->required();
    command->add_option("--library", options->library, "the provider's shared library")
        ->envname("PLEXOR_PROVIDER_LIBRARY");
    command->add_option("--provider", options->provider, "name that the factory begins with")
        ->capture_default_str();
    command
        ->add_option("--interval", options->intervalSeconds,
                     "seconds between two polls, and the provider's own polling interval")
        ->capture_default_str();
    command->add_option("--timeout", options->timeoutSeconds, "seconds to wait for the inventory")
        ->capture_default_str();
    command->add_flag("--debug", options->debug, "print all of the provider's log lines");
    command->callback([options, &status] { status = Watch(*options).run(); });
}

}  // namespace testbed
