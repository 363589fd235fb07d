// Who owns the broker's objects: scopes, attached threads, and for a while after their end nobody.
#pragma once

#include <cstddef>
#include <cstdint>
#include <deque>
#include <memory>
#include <mutex>
#include <unordered_map>
#include <vector>

namespace testbed {

class Object;
class ContextObject;

/// A number that no other thread of the process has or had; never 0.
std::uint64_t threadNumber();

/// A list of objects that grows and forgets those that have ended. Not thread-safe.
class ObjectList {
public:
    void add(std::shared_ptr<Object> object);
    std::vector<std::shared_ptr<Object>> take();

private:
    std::vector<std::shared_ptr<Object>> objects_;
    std::size_t pruneAt_ = 64;
};

/// The objects of one manager call or of one attached thread. Thread-safe.
class Arena {
public:
    /// `context` is the one that the thread was attached with, NULL for a manager call.
    explicit Arena(const ContextObject* context) : context_(context) {}

    void add(std::shared_ptr<Object> object);
    /// Ends every object, the youngest first.
    void endAll();
    /// Ends every object except contexts and results, which are the manager's own.
    void flush();
    const ContextObject* context() const { return context_; }
    std::uint64_t thread() const { return thread_; }

private:
    std::vector<std::shared_ptr<Object>> take();

    const ContextObject* const context_;
    const std::uint64_t thread_ = threadNumber();
    std::mutex mutex_;
    ObjectList objects_;  // guarded by mutex_
};

/// The arenas of every thread, innermost last, and one for objects made outside of all.
/// Thread-safe.
class ThreadArenas {
public:
    /// Opens an arena for the calling thread.
    std::shared_ptr<Arena> open(const ContextObject* context);
    /// Takes the arena from its thread; its objects are the caller's to end.
    void close(const std::shared_ptr<Arena>& arena);
    /// The calling thread's innermost arena, NULL when it has none.
    std::shared_ptr<Arena> current();
    /// The calling thread's arena that was opened with that context, NULL when there is none.
    std::shared_ptr<Arena> attachedWith(const ContextObject* context);
    /// Where objects go that are made on a thread without an arena; ends with the broker.
    Arena& outside() { return outside_; }
    /// Ends everything on every thread.
    void endAll();

private:
    std::mutex mutex_;
    std::unordered_map<std::uint64_t, std::vector<std::shared_ptr<Arena>>> byThread_;  // by mutex_
    Arena outside_{nullptr};
};

/// Keeps the shells of the objects that ended last, so that their addresses are not used again
/// soon and a use after the end is noticed instead of hitting another object. Thread-safe.
class Quarantine {
public:
    void add(std::shared_ptr<Object> ended);

private:
    static constexpr std::size_t capacity = 65536;
    std::mutex mutex_;
    std::deque<std::shared_ptr<Object>> shells_;  // guarded by mutex_
};

}  // namespace testbed
