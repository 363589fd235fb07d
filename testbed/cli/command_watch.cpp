// The loop of polling, printing what differs and carrying out commands.
#include "command_watch.h"

#include <syslog.h>
#include <unistd.h>

#include <CLI/CLI.hpp>
#include <iostream>
#include <memory>

#include "exit_status.h"
#include "input_lines.h"
#include "inventory_changes.h"
#include "live_session.h"
#include "provider_log.h"
#include "tree_view.h"

namespace testbed {
namespace {

struct WatchOptions {
    LiveOptions live;
    unsigned intervalSeconds = 1;
    unsigned timeoutSeconds = 60;
    bool debug = false;

    LiveOptions withInterval() const {
        LiveOptions options = live;
        options.intervalSeconds = intervalSeconds;
        return options;
    }
};

/// A client that polls, the array's commands, and the provider's log, in one stream of lines.
class Watch : private LiveSession {
public:
    explicit Watch(const WatchOptions& options)
        : LiveSession(options.withInterval()), options_(options) {}

    int run() {
        const std::chrono::seconds limit(options_.timeoutSeconds);
        if (!session().waitForInventory(limit, kServedNamespace)) {
            std::cerr << "plexor-testbed: the inventory is not complete after "
                      << options_.timeoutSeconds << " s\n";
            return kProviderFailed;
        }
        last_ = ask();
        printer().line(tree());
        showLog();
        while (passTime() && takeInput()) {
            takeNewFile();
            poll();
        }
        return hasFailed() ? kRefusedStatus : 0;
    }

private:
    void showLog() {
        directProviderLog(LOG_DEBUG, [this, all = options_.debug](int, const std::string& text) {
            if (all || tellsOfChange(text)) printer().line("    log: " + text);
        });
    }

    /// Lines about devices that change, come or go.
    static bool tellsOfChange(const std::string& text) {
        if (text.starts_with("Data 0x")) return false;  // the lists' own tracing
        for (const char* part : {" changed. ", " pool changed, ", " removed from ", " deleted",
                                 " added to the list", "failed, status"}) {
            if (text.find(part) != std::string::npos) return true;
        }
        return false;
    }

    void poll() {
        Inventory now = ask();
        for (const std::string& line : changeLines(last_, now)) printer().line(line);
        last_ = std::move(now);
    }

    /// Carries out the command that arrives within an interval, if one does. False at the end.
    bool takeInput() {
        const auto line = input_.next(std::chrono::seconds(options_.intervalSeconds));
        return line ? execute(*line) : !input_.atEnd();
    }

    std::string tree() override { return treeView(last_, TreeStyle::ofOutput(false)); }

    void wait(int seconds) override {
        for (int i = 0; i < seconds && passTime(); i++) {
            sleep(1);
            poll();
        }
    }

    WatchOptions options_;
    InputLines input_;
    Inventory last_;
};

}  // namespace

void addWatchCommand(CLI::App& app, int& status) {
    const auto options = std::make_shared<WatchOptions>();
    CLI::App* command = app.add_subcommand(
        "watch",
        "Polls the provider while the array changes: by commands on standard input (help lists "
        "them), by the scenario's timeline, or by a new version of the scenario file");
    addLiveOptions(*command, options->live);
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
