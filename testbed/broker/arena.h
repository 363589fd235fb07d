// Who owns the broker's objects: scopes, attached threads, and for a while after their end nobody.
#pragma once

#include <pthread.h>

#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>
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
    /// Those that live, without contexts and results, which are the manager's own.
    std::size_t count() const;

private:
    std::vector<std::shared_ptr<Object>> objects_;
    std::size_t pruneAt_ = 64;
};

/// What opened an arena.
enum class Span { Call, Attachment, Thread };

/// The objects of one manager call, of one attachment, or of a whole thread. Thread-safe.
class Arena {
public:
    /// `context` is the one that the thread was attached with, NULL when it was not.
    explicit Arena(Span span, const ContextObject* context = nullptr)
        : span_(span), context_(context) {}

    void add(std::shared_ptr<Object> object);
    /// Ends every object, the youngest first.
    void endAll();
    /// Ends every object except contexts and results, which are the manager's own.
    void flush();
    /// What it keeps now, except contexts and results.
    std::size_t count();
    Span span() const { return span_; }
    const ContextObject* context() const { return context_; }
    std::uint64_t thread() const { return thread_; }
    std::thread::id threadId() const { return threadId_; }

private:
    std::vector<std::shared_ptr<Object>> take();

    const Span span_;
    const ContextObject* const context_;
    const std::uint64_t thread_ = threadNumber();
    const std::thread::id threadId_ = std::this_thread::get_id();
    std::mutex mutex_;
    ObjectList objects_;  // guarded by mutex_
};

/// The arenas of every thread, innermost last, and one for objects made outside of all.
/// Thread-safe.
class ThreadArenas {
public:
    /// Told on a thread that ends with arenas left, and how many objects they keep.
    using ThreadEnd = std::function<void(std::size_t objects)>;

    /// With `perThread` attachments own nothing: what is made outside of manager calls belongs to
    /// the thread. With `atThreadEnd` the arenas of a thread end with it.
    ThreadArenas(bool perThread = false, ThreadEnd atThreadEnd = {});
    ~ThreadArenas();
    ThreadArenas(const ThreadArenas&) = delete;
    ThreadArenas& operator=(const ThreadArenas&) = delete;

    /// Opens an arena for the calling thread.
    std::shared_ptr<Arena> open(Span span, const ContextObject* context = nullptr);
    /// Takes the arena from its thread; its objects are the caller's to end.
    void close(const std::shared_ptr<Arena>& arena);
    /// Where the calling thread's objects go; NULL when it has no arena.
    std::shared_ptr<Arena> current();
    /// Whether the calling thread is in a manager call or attached.
    bool isEntered();
    /// Ends what the calling thread has obtained: since the innermost call or attachment began, or
    /// ever when objects belong to threads. False when it has no arena.
    bool flush();
    /// Every arena of every thread.
    std::vector<std::shared_ptr<Arena>> all();
    /// The calling thread's arena that was opened with that context, NULL when there is none.
    std::shared_ptr<Arena> attachedWith(const ContextObject* context);
    /// Where objects go that are made on a thread without an arena; ends with the broker.
    Arena& outside() { return outside_; }
    /// Ends everything on every thread.
    void endAll();

private:
    using Stack = std::vector<std::shared_ptr<Arena>>;

    static void threadEnds(void* arenas);
    /// The calling thread's arenas, innermost last.
    Stack ofThread();

    const bool perThread_;
    const ThreadEnd atThreadEnd_;
    pthread_key_t threadEnd_ = 0;  // in use when atThreadEnd_ is set
    std::mutex mutex_;
    std::unordered_map<std::uint64_t, Stack> byThread_;  // guarded by mutex_
    Arena outside_{Span::Call};
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
