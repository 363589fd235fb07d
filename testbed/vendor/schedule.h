// Commands that wait for their time.
#pragma once

#include <optional>
#include <string>
#include <vector>

namespace testbed {

/// A command at its time; `subject` is what it completes, "" for one that stands by itself, and
/// `lasts` how long that takes in all.
struct ScheduledCommand {
    double at = 0;
    std::string command;
    std::string subject;
    double lasts = 0;
};

/// For one thread. Times are seconds of the scenario.
class Schedule {
public:
    void add(ScheduledCommand command);
    /// Takes away what would complete the subject.
    void cancel(const std::string& subject);
    void clear() { commands_.clear(); }
    /// The first command whose time has come, taken out.
    std::optional<ScheduledCommand> takeDue(double now);
    /// In the order of time; equal times as added.
    const std::vector<ScheduledCommand>& commands() const { return commands_; }

private:
    std::vector<ScheduledCommand> commands_;
};

}  // namespace testbed
