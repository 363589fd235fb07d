// Asking on a thread of its own, within the user's time, and printing tree, check or metrics.
#include "command_ask.h"

#include <unistd.h>

#include <CLI/CLI.hpp>
#include <functional>
#include <future>
#include <iostream>
#include <memory>
#include <thread>

#include "ask_options.h"
#include "inventory_gaps.h"
#include "json_view.h"
#include "metrics_view.h"
#include "output_status.h"
#include "terminal.h"
#include "tree_view.h"

namespace testbed {
namespace {

constexpr int kFailed = 1;
constexpr int kServerFailed = 3;
/// For the connection's own deadline, which tells more, to come first.
constexpr std::chrono::milliseconds kGrace{250};

/// What the command prints, and how it ends.
struct Report {
    std::string output;
    std::string errors;
    int status = 0;
};

using Asking = std::function<Report(std::atomic<int>& answered)>;

std::string errorLine(const std::string& text) {
    return "plexor-testbed: " + text + "\n";
}

/// An asking on a thread of its own: neither a name server nor an answer that takes long to
/// understand may hold the command beyond its time.
class Watched {
public:
    Watched(const AskOptions& options, Asking ask)
        : classes_(options.className.empty() ? servedClasses().size() : 1),
          report_(promise_.get_future()),
          thread_([this, ask = std::move(ask)] { run(ask); }) {}
    ~Watched() { thread_.join(); }
    Watched(const Watched&) = delete;
    Watched& operator=(const Watched&) = delete;

    /// None when the time has run out: the process has to end without the thread.
    std::optional<Report> within(std::chrono::milliseconds time) {
        const Progress progress([this](int seconds) {
            return "asking, " + std::to_string(answered_.load()) + " answers for " +
                   std::to_string(classes_) + " classes, " + std::to_string(seconds) + " s";
        });
        if (report_.wait_for(time) != std::future_status::ready) return std::nullopt;
        return report_.get();
    }

private:
    void run(const Asking& ask) {
        try {
            promise_.set_value(ask(answered_));
        } catch (...) {
            promise_.set_exception(std::current_exception());
        }
    }

    std::size_t classes_;
    std::atomic<int> answered_ = 0;
    std::promise<Report> promise_;
    std::future<Report> report_;
    std::thread thread_;
};

int print(const Report& report, bool isCheck) {
    std::cout << report.output;
    const int status = statusOfOutput(report.status, isCheck);
    std::cerr << report.errors << std::flush;
    return status;
}

/// Prints the report, or `late` when there is none in time; then the process ends here.
int runInTime(const AskOptions& options, Asking ask, const Report& late) {
    Watched watched(options, std::move(ask));
    const auto report = watched.within(std::chrono::seconds(options.timeoutSeconds) + kGrace);
    if (!report) _exit(print(late, options.check.check));
    return print(*report, options.check.check);
}

std::string lateText(const AskOptions& options) {
    return "no answer within " + std::to_string(options.timeoutSeconds) + " s";
}

Report checkReport(const AskOptions& options, const Inventory& inventory,
                   const CheckSummary& summary) {
    return {options.json ? jsonView(inventory, options.check.policy, &summary)
                         : checkText(summary, options.check.verbosity),
            "", summary.status};
}

int check(const AskOptions& options) {
    const auto ask = [&options](std::atomic<int>& answered) {
        Answers answers;
        const CheckSummary summary = summaryOf([&] {
            answers = askServer(targetOf(options), answered);
            return summarize(answers.inventory,
                             {.failure = answers.failure,
                              .expected = options.check.expected,
                              .policy = options.check.policy,
                              .arriving = answers.arriving,
                              .time = AskTime{answers.seconds, options.timeoutSeconds}});
        });
        return checkReport(options, answers.inventory, summary);
    };
    return runInTime(options, ask, checkReport(options, {}, unknownSummary(lateText(options))));
}

std::string statusErrors(const Inventory& inventory) {
    std::string errors;
    for (const ClassAnswer& answer : inventory) {
        if (answer.response.rc != CMPI_RC_OK) errors += errorLine(statusLine(answer));
    }
    return errors;
}

std::string treeOf(const AskOptions& options, const Inventory& inventory) {
    TreeStyle style = TreeStyle::ofOutput(options.colour.onStandardOutput());
    style.problemsOnly = options.problems;
    style.policy = options.check.policy;
    return treeView(inventory, style);
}

int show(const AskOptions& options) {
    const auto ask = [&options](std::atomic<int>& answered) {
        const Answers answers = askServer(targetOf(options), answered);
        if (!answers.failure.empty()) throw WbemError(answers.failure);
        Report report{options.json ? jsonView(answers.inventory, options.check.policy)
                                   : treeOf(options, answers.inventory),
                      statusErrors(answers.inventory)};
        if (!answers.arriving.empty()) {
            report.errors += errorLine("inventory still arriving: " + answers.arriving);
        }
        report.status = report.errors.empty() ? 0 : kServerFailed;
        return report;
    };
    return runInTime(options, ask, {"", errorLine(lateText(options)), kFailed});
}

/// Whoever collects metrics wants to read there that nothing was answered.
int metrics(const AskOptions& options) {
    const auto ask = [&options](std::atomic<int>& answered) {
        const Answers answers = askServer(targetOf(options), answered);
        const CheckPolicy& policy = options.check.policy;
        std::string errors = statusErrors(answers.inventory);
        if (!answers.failure.empty()) errors += errorLine(answers.failure);
        const bool up = errors.empty();
        const bool complete =
            up && answers.arriving.empty() && gapsIn(answers.inventory, policy).empty();
        return Report{metricsView(answers.inventory, policy, {up, complete, answers.seconds}),
                      errors};
    };
    const double limit = options.timeoutSeconds;
    return runInTime(options, ask,
                     {metricsView({}, {}, {false, false, limit}), errorLine(lateText(options))});
}

int run(const AskOptions& options) {
    requireSense(options);
    if (options.check.check) return check(options);
    return options.metrics ? metrics(options) : show(options);
}

}  // namespace

void addAskCommand(CLI::App& app, int& status) {
    const auto options = std::make_shared<AskOptions>();
    CLI::App* command =
        app.add_subcommand("ask", "Shows or checks what a WBEM server answers over CIM-XML");
    addAskOptions(*command, *options, false);
    command->callback([options, &status] { status = run(*options); });
}

void makePlugin(CLI::App& app, int& status) {
    const auto options = std::make_shared<AskOptions>();
    addAskOptions(app, *options, true);
    app.callback([options, &status] {
        options->check.check = true;
        status = run(*options);
    });
}

}  // namespace testbed
