// Standard input, line by line, for a program that has other things to wait for.
#pragma once

#include <chrono>
#include <optional>
#include <string>

namespace testbed {

class InputLines {
public:
    /// The next line without its end. None when it has not arrived within `limit`, when `interrupt`
    /// (a descriptor) becomes readable before, and behind the last line, for which it waits as
    /// well.
    std::optional<std::string> next(std::chrono::milliseconds limit, int interrupt = -1);

    /// True when all lines have been given.
    bool atEnd() const { return ended_ && arrived_.empty(); }

private:
    std::optional<std::string> takeLine();
    void receive();

    std::string arrived_;
    bool ended_ = false;
};

}  // namespace testbed
