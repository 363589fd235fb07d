// Carrying out the live commands, passing the array's time, and noticing a new version of the file.
#include "live_session.h"

#include <sys/stat.h>
#include <syslog.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <charconv>
#include <cmath>
#include <iomanip>
#include <iostream>
#include <sstream>

#include "array_commands.h"
#include "command_words.h"
#include "library_locator.h"
#include "manager_option.h"
#include "provider_log.h"
#include "scenario_locator.h"
#include "scenario_parser.h"
#include "schema_choice.h"
#include "whole_line.h"

namespace testbed {

namespace {

constexpr double kSlowest = 0.001;
constexpr double kFastest = 1000000;

}  // namespace

void addLiveOptions(CLI::App& command, LiveOptions& options) {
    addScenarioOption(command, options.scenario);
    command.add_option("--library", options.library, "the provider's shared library")
        ->envname("PLEXOR_PROVIDER_LIBRARY");
    command.add_option("--provider", options.provider, "name that the factory begins with")
        ->capture_default_str();
    command.add_option("--schema", options.schema, kSchemaHelp);
    addManagerOption(command, options.manager);
    command
        .add_option("--speed", options.speed,
                    "how much faster than the clock the array's time goes")
        ->check(CLI::Range(kSlowest, kFastest))
        ->capture_default_str();
    command.add_flag("--strict", options.strict, "end with status 1 when a command is refused");
}

namespace {

constexpr int kLongestWait = 1000000;

/// The seconds of "wait 5".
int secondsOf(const CommandWord& word) {
    int seconds = -1;
    const char* end = word.text.data() + word.text.size();
    const auto [rest, error] = std::from_chars(word.text.data(), end, seconds);
    if (error != std::errc() || rest != end || seconds < 0 || seconds > kLongestWait) {
        refuseCommand("a number of seconds from 0 to " + std::to_string(kLongestWait) +
                      " is needed behind wait");
    }
    return seconds;
}

/// The number of "speed 5".
double speedOf(const CommandWord& word) {
    const nlohmann::json value = nlohmann::json::parse(word.text, nullptr, false);
    const double speed = value.is_number() ? value.get<double>() : 0;
    if (speed < kSlowest || speed > kFastest) {
        refuseCommand("a number from 0.001 to 1000000 is needed behind speed");
    }
    return speed;
}

std::string timeText(double seconds) {
    std::ostringstream text;
    text << std::fixed << std::setprecision(seconds == std::floor(seconds) ? 0 : 1) << seconds;
    return text.str() + " s";
}

}  // namespace

void Printer::line(const std::string& text) {
    const std::lock_guard lock(mutex_);
    if (listener_) listener_(text);
    printLine(std::cout, text);
}

bool FileWatch::changed() {
    const auto now = stamp();
    return now != std::exchange(seen_, now);
}

std::pair<long, long> FileWatch::stamp() const {
    struct stat status = {};
    if (stat(file_.c_str(), &status) != 0) return {0, 0};
    return {status.st_mtim.tv_sec, status.st_mtim.tv_nsec};
}

LiveSession::LiveSession(const LiveOptions& options)
    : file_(options.scenario),
      clock_(options.speed),
      strict_(options.strict),
      session_(
          chosenManager(readScenario(options.scenario), options.manager),
          [&](Broker& broker) {
              if (options.onBroker) options.onBroker(broker);
              if (options.intervalSeconds) polling_.emplace(*options.intervalSeconds);
              array_ = std::make_unique<LiveArray>(broker, options.scenario);
              defineChosenClasses(broker.repository(), kServedNamespace, options.schema);
          },
          locateLibrary(options.library,
                        chosenManager(readScenario(options.scenario), options.manager)),
          options.provider) {}

LiveSession::~LiveSession() {
    directProviderLog(LOG_ERR, nullptr);
}

Inventory LiveSession::ask() {
    std::vector<std::string> names;
    for (const ServedClass& served : servedClasses()) names.push_back(served.name);
    InstanceClient client = session_.client();
    return collectInventory(client, names, kServedNamespace);
}

bool LiveSession::passTime() {
    clock_.begin();
    bool goesOn = true;
    for (const LiveArray::Done& done : array_->advance(clock_.now())) {
        printer_.line("[" + timeText(done.at) + "] " + done.command);
        if (!done.refusal.empty()) goesOn = print({true, false, done.refusal}) && goesOn;
    }
    return goesOn;
}

std::chrono::milliseconds LiveSession::pause(std::chrono::milliseconds longest) const {
    const double due = array_->nextDue();
    if (due < 0 || clock_.isPaused()) return longest;
    const double milliseconds = std::ceil((due - clock_.now()) / clock_.speed() * 1000);
    return std::chrono::milliseconds(
        static_cast<int>(std::clamp(milliseconds, 0.0, double(longest.count()))));
}

/// Prints a result. False when it ends the session.
bool LiveSession::print(const CommandResult& result) {
    if (!result.text.empty()) printer_.line(result.refused ? "? " + result.text : result.text);
    failed_ = failed_ || (result.refused && strict_);
    return !result.quits && !failed_;
}

void LiveSession::takeNewFile() {
    if (!file_.changed()) return;
    try {
        array_->reload();
    } catch (const std::runtime_error& error) {
        printer_.line(std::string("? ") + error.what());
    }
}

/// False for a command that is not about the array's time.
bool LiveSession::steerTime(const std::vector<CommandWord>& words) {
    const std::string& verb = words.at(0).text;
    const bool isSpeed = verb == "speed";
    if (!isSpeed && verb != "pause" && verb != "play") return false;
    if (words.size() != (isSpeed ? 2 : 1)) {
        refuseCommand(verb + (isSpeed ? " takes one number" : " takes nothing"));
    }
    if (isSpeed) {
        clock_.setSpeed(speedOf(words[1]));
    } else {
        clock_.pause(verb == "pause");
    }
    return true;
}

/// The commands that change the array.
CommandResult LiveSession::change(const std::string& line) {
    const auto words = commandWords(line);
    const std::string& verb = words.at(0).text;
    if (verb == "save") {
        if (words.size() != 2) refuseCommand("save takes one file");
        array_->save(words[1].text);
    } else if (verb == "reset") {
        array_->reset();
    } else if (!steerTime(words) && !executeOwn(line)) {
        array_->apply(line);
    }
    return {};
}

CommandResult LiveSession::carryOut(const std::string& line) {
    try {
        const auto words = commandWords(line);
        if (words.empty() || line[0] == '#') return {};
        const std::string& verb = words[0].text;
        if (words.size() == 1) {
            if (verb == "quit") return {false, true, ""};
            if (verb == "show") return {false, false, tree()};
            if (verb == "help") return {false, false, commandHelpText()};
        }
        if (verb == "wait") refuseCommand("wait is for commands on standard input");
        printer_.line("> " + line);
        return change(line);
    } catch (const std::runtime_error& error) {
        return {true, false, error.what()};
    }
}

bool LiveSession::execute(const std::string& line) {
    try {
        const auto words = commandWords(line);
        if (!words.empty() && words[0].text == "wait") {
            if (words.size() != 2) refuseCommand("wait takes a number of seconds");
            wait(secondsOf(words[1]));
            return true;
        }
    } catch (const ScenarioError& error) {
        return print({true, false, error.what()});
    }
    return print(carryOut(line));
}

}  // namespace testbed
