// A provider at work on an array that changes while it runs: by commands, or by a new version of
// its scenario file.
#pragma once

#include <chrono>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "array_clock.h"
#include "command_words.h"
#include "control_socket.h"
#include "inventory.h"
#include "live_array.h"
#include "polling_interval.h"
#include "provider_session.h"

namespace CLI {
class App;
}

namespace testbed {

/// Namespace of the provider's classes.
inline constexpr const char* kServedNamespace = "root/cimv2";

struct LiveOptions {
    std::string scenario;
    std::string library;
    std::string schema;
    std::string manager;  ///< in place of the scenario's; "": that one
    std::string provider = "PlexorProvider";
    std::optional<unsigned> intervalSeconds;  ///< of the provider's polling; its own without
    double speed = 1;                         ///< seconds of the scenario in a second
    bool strict = false;                      ///< a refused command ends the session
    /// Called with the broker before the provider is loaded, which may take long.
    std::function<void(Broker&)> onBroker = nullptr;
};

/// The options that every live command takes. `options` must live until the command runs.
void addLiveOptions(CLI::App& command, LiveOptions& options);

/// Lines of output, whole ones, whichever thread prints them.
class Printer {
public:
    void line(const std::string& text);
    /// From now on `listener` is told every line before it is printed.
    void tell(std::function<void(const std::string&)> listener) {
        const std::lock_guard lock(mutex_);
        listener_ = std::move(listener);
    }

private:
    std::mutex mutex_;
    std::function<void(const std::string&)> listener_;
};

/// Tells when a file has been written anew.
class FileWatch {
public:
    explicit FileWatch(std::string file) : file_(std::move(file)), seen_(stamp()) {}
    bool changed();

private:
    std::pair<long, long> stamp() const;
    std::string file_;
    std::pair<long, long> seen_;
};

class LiveSession {
public:
    virtual ~LiveSession();
    LiveSession(const LiveSession&) = delete;
    LiveSession& operator=(const LiveSession&) = delete;

protected:
    /// Loads the provider. Throws what ProviderSession throws, and ScenarioError.
    explicit LiveSession(const LiveOptions& options);

    /// What the provider answers for all its classes now.
    Inventory ask();
    /// Carries out a command of the input and prints what comes of it. False when it ends the
    /// session.
    bool execute(const std::string& line);
    /// Carries out a command of somebody who gets the result.
    CommandResult carryOut(const std::string& line);
    /// Takes the scenario file when it has been written anew.
    void takeNewFile();
    /// Carries out what the array's time has come for; the first call begins it. False when that
    /// ends the session.
    bool passTime();
    /// How long nothing is to be done for passTime, `longest` at most.
    std::chrono::milliseconds pause(std::chrono::milliseconds longest) const;
    /// Whether a refused command has ended the session.
    bool hasFailed() const { return failed_; }

    ProviderSession& session() { return session_; }
    const LiveArray& array() const { return *array_; }
    const ArrayClock& clock() const { return clock_; }
    Printer& printer() { return printer_; }

    /// The tree as last seen.
    virtual std::string tree() = 0;
    /// Takes no command of the input for that long.
    virtual void wait(int seconds) = 0;
    /// Carries out a command that only this kind of session has; false when it is none of those.
    /// Throws a std::runtime_error for the user.
    virtual bool executeOwn(const std::string& /*line*/) { return false; }

private:
    CommandResult change(const std::string& line);
    bool print(const CommandResult& result);
    bool steerTime(const std::vector<CommandWord>& words);

    Printer printer_;
    std::optional<PollingInterval> polling_;
    FileWatch file_;
    std::unique_ptr<LiveArray> array_;
    ArrayClock clock_;
    bool strict_;
    bool failed_ = false;
    ProviderSession session_;
};

}  // namespace testbed
