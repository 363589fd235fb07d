// A provider at work on an array that changes while it runs: by commands, or by a new version of
// its scenario file.
#pragma once

#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <utility>

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
    std::string provider = "PlexorProvider";
    std::optional<unsigned> intervalSeconds;  ///< of the provider's polling; its own without
    /// Called with the broker before the provider is loaded, which may take long.
    std::function<void(Broker&)> onBroker = nullptr;
};

/// The options that every live command takes. `options` must live until the command runs.
void addLiveOptions(CLI::App& command, LiveOptions& options);

/// Lines of output, whole ones, whichever thread prints them.
class Printer {
public:
    void line(const std::string& text);

private:
    std::mutex mutex_;
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
    /// Carries out a command. False when it ends the session.
    bool execute(const std::string& line);
    /// Takes the scenario file when it has been written anew.
    void takeNewFile();

    ProviderSession& session() { return session_; }
    Printer& printer() { return printer_; }

    /// The commands whose effect is not the array's.
    virtual void show() = 0;
    virtual void wait(int seconds) = 0;
    /// Carries out a command that only this kind of session has; false when it is none of those.
    /// Throws a std::runtime_error for the user.
    virtual bool executeOwn(const std::string& /*line*/) { return false; }

private:
    template <typename Change>
    void change(Change makeChange);

    Printer printer_;
    std::optional<PollingInterval> polling_;
    FileWatch file_;
    std::unique_ptr<LiveArray> array_;
    ProviderSession session_;
};

}  // namespace testbed
