// The built tool, run as users run it.
#pragma once

#include <sys/types.h>

#include <string>

struct Outcome {
    int status = -1;  ///< -1 when a signal ended it
    std::string output;
    std::string errors;
};

/// Runs the tool to its end; the arguments are words of a shell.
Outcome runTool(const std::string& arguments);

/// `plexor-testbed serve` on a free port, until it is destroyed.
class ServingTool {
public:
    /// Throws std::runtime_error when it does not begin to serve.
    explicit ServingTool(const std::string& arguments);
    ~ServingTool();
    ServingTool(const ServingTool&) = delete;
    ServingTool& operator=(const ServingTool&) = delete;

    /// What it says it serves.
    const std::string& url() const { return url_; }

private:
    pid_t process_ = -1;
    int output_ = -1;
    std::string url_;
};
