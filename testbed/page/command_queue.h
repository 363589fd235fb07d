// Commands of other threads for the one that the array belongs to.
#pragma once

#include <condition_variable>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>

#include "control_socket.h"
#include "file_descriptor.h"

namespace testbed {

class CommandQueue {
public:
    /// Throws std::runtime_error when the system refuses.
    CommandQueue();

    /// Waits until the command has been carried out. A queue that is closed refuses it.
    CommandResult submit(const std::string& command);
    /// Becomes readable when there is something to attend to.
    int descriptor() const { return wake_.get(); }
    /// Carries out what waits.
    void attend(const std::function<CommandResult(const std::string&)>& carryOut);
    /// Refuses what waits and what comes.
    void close();

private:
    struct Entry {
        std::string command;
        CommandResult result = {};
        bool isDone = false;
    };

    void finish(Entry& entry, CommandResult result);

    FileDescriptor wake_;
    std::mutex mutex_;
    std::condition_variable done_;
    std::deque<std::shared_ptr<Entry>> waiting_;  // guarded by mutex_, as are the entries
    bool closed_ = false;                         // guarded by mutex_
};

}  // namespace testbed
