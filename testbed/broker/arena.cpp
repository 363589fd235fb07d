// Opening and ending arenas, thread by thread, and the shells that stay to tell of late uses.
#include "arena.h"

#include <algorithm>
#include <atomic>
#include <stdexcept>
#include <utility>

#include "object.h"

namespace testbed {

namespace {

bool isManagers(const Object& object) {
    return object.kind() == ObjectKind::Context || object.kind() == ObjectKind::Result;
}

}  // namespace

std::uint64_t threadNumber() {
    static std::atomic<std::uint64_t> last = 0;
    // Thread ids are given out again after a thread's end, these are not.
    thread_local std::uint64_t own = 0;
    if (own == 0) own = ++last;
    return own;
}

void ObjectList::add(std::shared_ptr<Object> object) {
    if (objects_.size() >= pruneAt_) {
        std::erase_if(objects_, [](const auto& kept) { return !kept->isAlive(); });
        pruneAt_ = std::max<std::size_t>(64, 2 * objects_.size());
    }
    objects_.push_back(std::move(object));
}

std::vector<std::shared_ptr<Object>> ObjectList::take() {
    return std::exchange(objects_, {});
}

std::size_t ObjectList::count() const {
    return static_cast<std::size_t>(std::count_if(
        objects_.begin(), objects_.end(),
        [](const auto& object) { return object->isAlive() && !isManagers(*object); }));
}

std::size_t Arena::count() {
    const std::lock_guard lock(mutex_);
    return objects_.count();
}

void Arena::add(std::shared_ptr<Object> object) {
    const std::lock_guard lock(mutex_);
    objects_.add(std::move(object));
}

std::vector<std::shared_ptr<Object>> Arena::take() {
    const std::lock_guard lock(mutex_);
    return objects_.take();
}

void Arena::endAll() {
    const auto objects = take();
    std::for_each(objects.rbegin(), objects.rend(), [](const auto& object) { object->end(); });
}

void Arena::flush() {
    auto objects = take();
    std::reverse(objects.begin(), objects.end());
    for (std::shared_ptr<Object>& object : objects) {
        if (isManagers(*object)) {
            add(std::move(object));
        } else {
            object->end();
        }
    }
}

ThreadArenas::ThreadArenas(bool perThread, ThreadEnd atThreadEnd)
    : perThread_(perThread), atThreadEnd_(std::move(atThreadEnd)) {
    // Not a thread_local object: that would keep a module with this code mapped until the thread's
    // end.
    if (atThreadEnd_ && pthread_key_create(&threadEnd_, threadEnds) != 0) {
        throw std::runtime_error("no more keys for thread ends");
    }
}

ThreadArenas::~ThreadArenas() {
    if (atThreadEnd_) pthread_key_delete(threadEnd_);
}

void ThreadArenas::threadEnds(void* arenas) {
    auto& self = *static_cast<ThreadArenas*>(arenas);
    const Stack left = self.ofThread();
    std::size_t objects = 0;
    for (const std::shared_ptr<Arena>& arena : left) objects += arena->count();
    self.atThreadEnd_(objects);
    for (const std::shared_ptr<Arena>& arena : left) {
        self.close(arena);
        arena->endAll();
    }
}

std::shared_ptr<Arena> ThreadArenas::open(Span span, const ContextObject* context) {
    auto arena = std::make_shared<Arena>(span, context);
    if (atThreadEnd_) pthread_setspecific(threadEnd_, this);
    const std::lock_guard lock(mutex_);
    Stack& stack = byThread_[arena->thread()];
    // What belongs to the thread is older than every call and attachment on it.
    stack.insert(span == Span::Thread ? stack.begin() : stack.end(), arena);
    return arena;
}

void ThreadArenas::close(const std::shared_ptr<Arena>& arena) {
    const std::lock_guard lock(mutex_);
    const auto found = byThread_.find(arena->thread());
    if (found == byThread_.end()) return;
    std::erase(found->second, arena);
    if (found->second.empty()) byThread_.erase(found);
}

ThreadArenas::Stack ThreadArenas::ofThread() {
    const std::lock_guard lock(mutex_);
    const auto found = byThread_.find(threadNumber());
    return found == byThread_.end() ? Stack{} : found->second;
}

std::shared_ptr<Arena> ThreadArenas::current() {
    if (!perThread_) {
        const std::lock_guard lock(mutex_);
        const auto found = byThread_.find(threadNumber());
        return found == byThread_.end() ? nullptr : found->second.back();
    }
    const Stack stack = ofThread();
    const auto owner = std::find_if(stack.rbegin(), stack.rend(), [](const auto& arena) {
        return arena->span() != Span::Attachment;
    });
    return owner != stack.rend() ? *owner : open(Span::Thread);
}

bool ThreadArenas::isEntered() {
    const Stack stack = ofThread();
    return std::any_of(stack.begin(), stack.end(),
                       [](const auto& arena) { return arena->span() != Span::Thread; });
}

bool ThreadArenas::flush() {
    const Stack stack = ofThread();
    if (stack.empty()) return false;
    if (!perThread_) {
        stack.back()->flush();
        return true;
    }
    std::for_each(stack.rbegin(), stack.rend(), [](const auto& arena) { arena->flush(); });
    return true;
}

ThreadArenas::Stack ThreadArenas::all() {
    const std::lock_guard lock(mutex_);
    Stack arenas;
    for (const auto& [thread, stack] : byThread_) {
        arenas.insert(arenas.end(), stack.begin(), stack.end());
    }
    return arenas;
}

std::shared_ptr<Arena> ThreadArenas::attachedWith(const ContextObject* context) {
    for (const std::shared_ptr<Arena>& arena : ofThread()) {
        if (arena->context() == context) return arena;
    }
    return nullptr;
}

void ThreadArenas::endAll() {
    std::unordered_map<std::uint64_t, Stack> byThread;
    {
        const std::lock_guard lock(mutex_);
        byThread.swap(byThread_);
    }
    for (auto& [thread, arenas] : byThread) {
        for (const std::shared_ptr<Arena>& arena : arenas) arena->endAll();
    }
    outside_.endAll();
}

void Quarantine::add(std::shared_ptr<Object> ended) {
    std::shared_ptr<Object> oldest;  // destroyed after the lock
    const std::lock_guard lock(mutex_);
    shells_.push_back(std::move(ended));
    if (shells_.size() <= capacity) return;
    oldest = std::move(shells_.front());
    shells_.pop_front();
}

}  // namespace testbed
