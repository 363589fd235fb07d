// Submitting a command and waiting for its result, and attending to what has been submitted.
#include "command_queue.h"

#include <sys/eventfd.h>
#include <unistd.h>

#include <cstdint>
#include <stdexcept>

namespace testbed {
namespace {

constexpr std::size_t kMostWaiting = 64;

}  // namespace

CommandQueue::CommandQueue() : wake_(eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
    if (!wake_.isOpen()) throw std::runtime_error("cannot wait for commands");
}

CommandResult CommandQueue::submit(const std::string& command) {
    const auto entry = std::make_shared<Entry>(Entry{command});
    std::unique_lock lock(mutex_);
    if (closed_) return {true, false, "the server ends"};
    if (waiting_.size() == kMostWaiting) return {true, false, "too many commands wait"};
    waiting_.push_back(entry);
    const std::uint64_t one = 1;
    [[maybe_unused]] const ssize_t size = write(wake_.get(), &one, sizeof one);
    done_.wait(lock, [&] { return entry->isDone; });
    return entry->result;
}

void CommandQueue::finish(Entry& entry, CommandResult result) {
    entry.result = std::move(result);
    entry.isDone = true;
    done_.notify_all();
}

void CommandQueue::attend(const std::function<CommandResult(const std::string&)>& carryOut) {
    std::uint64_t count = 0;
    [[maybe_unused]] const ssize_t size = read(wake_.get(), &count, sizeof count);
    std::unique_lock lock(mutex_);
    while (!waiting_.empty()) {
        const auto entry = waiting_.front();
        waiting_.pop_front();
        lock.unlock();
        CommandResult result = carryOut(entry->command);
        lock.lock();
        finish(*entry, std::move(result));
    }
}

void CommandQueue::close() {
    const std::lock_guard lock(mutex_);
    closed_ = true;
    for (const auto& entry : waiting_) finish(*entry, {true, false, "the server ends"});
    waiting_.clear();
}

}  // namespace testbed
