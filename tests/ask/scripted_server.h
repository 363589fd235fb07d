// A server that sends what a test says, byte for byte.
#pragma once

#include <chrono>
#include <functional>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

/// Listens on a free port of 127.0.0.1 and answers one connection after the other.
class ScriptedServer {
public:
    /// What is sent for a request (head and body), with kSameId replaced; the connection is closed
    /// afterwards.
    using Script = std::function<std::string(const std::string& request)>;

    explicit ScriptedServer(Script script);
    ~ScriptedServer();
    ScriptedServer(const ScriptedServer&) = delete;
    ScriptedServer& operator=(const ScriptedServer&) = delete;

    unsigned short port() const { return port_; }
    /// "http://127.0.0.1:PORT"
    std::string url() const;
    /// What clients have sent.
    std::vector<std::string> requests() const;
    /// From now on there is that long a pause before an answer, and between its bytes.
    void setPauses(std::chrono::milliseconds before, std::chrono::milliseconds between = {});

private:
    void run();
    void answer(int connection);
    /// False when the server is to end before the time is over.
    bool pause(std::chrono::milliseconds time) const;

    Script script_;
    int listener_ = -1;
    int wake_[2] = {-1, -1};
    unsigned short port_ = 0;
    mutable std::mutex mutex_;
    std::vector<std::string> requests_;    // guarded by mutex_
    std::chrono::milliseconds before_{};   // guarded by mutex_
    std::chrono::milliseconds between_{};  // guarded by mutex_
    std::thread thread_;
};
