// Adding commands, cancelling them, and taking those that are due.
#include "schedule.h"

#include <algorithm>

namespace testbed {

void Schedule::add(ScheduledCommand command) {
    const auto later =
        std::upper_bound(commands_.begin(), commands_.end(), command.at,
                         [](double at, const ScheduledCommand& other) { return at < other.at; });
    commands_.insert(later, std::move(command));
}

void Schedule::cancel(const std::string& subject) {
    std::erase_if(commands_,
                  [&](const ScheduledCommand& command) { return command.subject == subject; });
}

std::optional<ScheduledCommand> Schedule::takeDue(double now) {
    if (commands_.empty() || commands_.front().at > now) return std::nullopt;
    ScheduledCommand command = std::move(commands_.front());
    commands_.erase(commands_.begin());
    return command;
}

}  // namespace testbed
