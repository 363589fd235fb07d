#include "command_ask.h"

#include <unistd.h>

#include <CLI/CLI.hpp>
#include <future>
#include <iostream>
#include <memory>
#include <thread>

#include "check_command.h"
#include "colour.h"
#include "inventory.h"
#include "json_view.h"
#include "tree_view.h"
#include "wbem_client.h"

namespace testbed {
namespace {

constexpr int kFailed = 1;
constexpr int kServerFailed = 3;
/// For the connection's own deadline, which tells more, to come first.
constexpr std::chrono::milliseconds kGrace{250};

struct AskOptions {
    std::string url;
    std::string nameSpace = "root/cimv2";
    std::string className;
    std::string user;
    std::string passwordFile;
    TlsOptions tls;
    bool insecure = false;
    unsigned timeoutSeconds = 30;
    bool json = false;
    CheckOptions check;
    ColourChoice colour;
};

/// What a server answered, and why it did not answer more; "" when it did.
struct Answers {
    Inventory inventory;
    std::string failure;
};

std::vector<std::string> classesToAsk(const std::string& className) {
    if (!className.empty()) return {className};
    std::vector<std::string> names;
    for (const ServedClass& served : servedClasses()) names.push_back(served.name);
    return names;
}

WbemUrl urlOf(const AskOptions& options) {
    WbemUrl url = parseWbemUrl(options.url);
    if (!options.user.empty()) url.credentials = Credentials{options.user, ""};
    if (options.passwordFile.empty()) return url;
    if (!url.credentials) throw WbemError("a password, but no user; name one with --user");
    url.credentials->password = readPassword(options.passwordFile);
    return url;
}

Answers ask(const AskOptions& options, Deadline deadline) {
    const WbemUrl url = urlOf(options);
    WbemClientOptions settings;
    settings.deadline = deadline;
    settings.tls = options.tls;
    settings.tls.verify = !options.insecure;
    WbemClient client(url, settings);
    Answers answers;
    try {
        for (const std::string& name : classesToAsk(options.className))
            answers.inventory.push_back(
                {name, client.enumerateInstances(name, {}, options.nameSpace)});
    } catch (const WbemError& error) {
        answers.failure = url.authority() + ": " + error.what();
    }
    return answers;
}

/// Asks on a thread of its own: neither a name server nor an answer that takes long to understand
/// may hold the command beyond its time. When that has run out, `late` is to end the process, as
/// the thread cannot be stopped.
Answers askInTime(const AskOptions& options, const std::function<void(const std::string&)>& late) {
    const Deadline deadline =
        std::chrono::steady_clock::now() + std::chrono::seconds(options.timeoutSeconds);
    std::packaged_task<Answers()> task([&] { return ask(options, deadline); });
    std::future<Answers> answers = task.get_future();
    std::thread thread(std::move(task));
    if (answers.wait_until(deadline + kGrace) != std::future_status::ready)
        late("no answer within " + std::to_string(options.timeoutSeconds) + " s");
    thread.join();
    return answers.get();
}

[[noreturn]] void endProcess(int status) {
    std::cout.flush();
    _exit(status);
}

int check(const AskOptions& options) {
    const auto late = [](const std::string& reason) {
        endProcess(printCheck(unknownSummary(reason)));
    };
    return printCheck(summaryOf([&] {
        const Answers answers = askInTime(options, late);
        return summarize(answers.inventory,
                         {answers.failure, options.check.expected, options.check.policy});
    }));
}

bool reportStatuses(const Inventory& inventory) {
    bool failed = false;
    for (const ClassAnswer& answer : inventory) {
        if (answer.response.rc == CMPI_RC_OK) continue;
        std::cerr << "plexor-testbed: " << statusLine(answer) << "\n";
        failed = true;
    }
    return failed;
}

int show(const AskOptions& options) {
    const auto late = [](const std::string& reason) {
        std::cerr << "plexor-testbed: " << reason << std::endl;
        endProcess(kFailed);
    };
    const Answers answers = askInTime(options, late);
    if (!answers.failure.empty()) throw WbemError(answers.failure);
    const bool colours = options.colour.onStandardOutput();
    std::cout << (options.json ? jsonView(answers.inventory) : treeView(answers.inventory, {.colours = colours}))
              << std::flush;
    return reportStatuses(answers.inventory) ? kServerFailed : 0;
}

void addConnectionOptions(CLI::App& command, AskOptions& options) {
    command.add_option("url", options.url, "http[s]://[user:password@]host[:port][/path]")
        ->required();
    command.add_option("--user", options.user, "user name, instead of the URL's");
    command.add_option("--password-file", options.passwordFile,
                       "file whose first line is the password, instead of the URL's");
    command.add_option("--ca-file", options.tls.authorities,
                       "certificates to trust, instead of the system's");
    command.add_flag("--insecure", options.insecure, "trust any certificate");
    command.add_option("--timeout", options.timeoutSeconds, "seconds that all of it may take")
        ->check(CLI::Range(1, 86400))
        ->capture_default_str();
}

}  // namespace

void addAskCommand(CLI::App& app, int& status) {
    const auto options = std::make_shared<AskOptions>();
    CLI::App* command =
        app.add_subcommand("ask", "Shows or checks what a WBEM server answers over CIM-XML");
    addConnectionOptions(*command, *options);
    command->add_option("--namespace", options->nameSpace, "namespace of the requests")
        ->capture_default_str();
    command->add_option("--class", options->className, "ask for this class only")
        ->check(CLI::IsMember(classesToAsk("")));
    CLI::Option* json = command->add_flag("--json", options->json, "print JSON instead of a tree");
    addCheckOptions(*command, options->check)->excludes(json);
    addColourOption(*command, options->colour);
    command->callback(
        [options, &status] { status = options->check.check ? check(*options) : show(*options); });
}

}  // namespace testbed
