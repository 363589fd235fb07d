// Standard input, line by line, for a program that has other things to wait for.
#pragma once

#include <chrono>
#include <optional>
#include <string>

namespace testbed {

class InputLines {
public:
    /// What the end of a named pipe means: the end of the input, or that the next writer may come.
    enum class Pipe { Ends, Reopens };

    /// From now on reading in the background of a terminal does not stop the process.
    explicit InputLines(Pipe pipe = Pipe::Ends);

    /// The next line without its end. None when it has not arrived within `limit`, when `interrupt`
    /// (a descriptor) becomes readable before, and behind the last line, for which it waits as
    /// well.
    std::optional<std::string> next(std::chrono::milliseconds limit, int interrupt = -1);

    /// The descriptor to wait for; -1 while there is nothing to be read: behind the end, and as
    /// long as another job has the terminal. To be asked again after a second at most.
    int descriptor() const;
    /// Reads what has arrived; for a descriptor that is readable.
    void receive();
    /// The first line that has been received.
    std::optional<std::string> take();

    /// True when all lines have been given.
    bool atEnd() const { return ended_ && arrived_.empty(); }

private:
    bool reopen();

    Pipe pipe_;
    int descriptor_;
    std::string arrived_;
    bool ended_ = false;
};

}  // namespace testbed
