#include "arena.h"

#include <algorithm>
#include <atomic>
#include <utility>

#include "object.h"

namespace testbed {

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
        const bool isManagers =
            object->kind() == ObjectKind::Context || object->kind() == ObjectKind::Result;
        if (isManagers) {
            add(std::move(object));
        } else {
            object->end();
        }
    }
}

std::shared_ptr<Arena> ThreadArenas::open(const ContextObject* context) {
    auto arena = std::make_shared<Arena>(context);
    const std::lock_guard lock(mutex_);
    byThread_[arena->thread()].push_back(arena);
    return arena;
}

void ThreadArenas::close(const std::shared_ptr<Arena>& arena) {
    const std::lock_guard lock(mutex_);
    const auto found = byThread_.find(arena->thread());
    if (found == byThread_.end()) return;
    std::erase(found->second, arena);
    if (found->second.empty()) byThread_.erase(found);
}

std::shared_ptr<Arena> ThreadArenas::current() {
    const std::lock_guard lock(mutex_);
    const auto found = byThread_.find(threadNumber());
    return found == byThread_.end() ? nullptr : found->second.back();
}

std::shared_ptr<Arena> ThreadArenas::attachedWith(const ContextObject* context) {
    const std::lock_guard lock(mutex_);
    const auto found = byThread_.find(threadNumber());
    if (found == byThread_.end()) return nullptr;
    for (const std::shared_ptr<Arena>& arena : found->second) {
        if (arena->context() == context) return arena;
    }
    return nullptr;
}

void ThreadArenas::endAll() {
    std::unordered_map<std::uint64_t, std::vector<std::shared_ptr<Arena>>> all;
    {
        const std::lock_guard lock(mutex_);
        all.swap(byThread_);
    }
    for (auto& [thread, arenas] : all) {
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
