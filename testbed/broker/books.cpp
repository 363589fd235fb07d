// The names of the table entries, and the lists of calls, living objects and misuses.
#include "books.h"

#include <algorithm>
#include <iterator>
#include <limits>

namespace testbed {

namespace {

constexpr std::size_t notKept = std::numeric_limits<std::size_t>::max();

// In the order of Entry.
constexpr const char* entryNames[] = {
    "prepareAttachThread",
    "attachThread",
    "detachThread",
    "enumerateInstanceNames",
    "enumerateInstances",
    "getInstance",
    "associators",
    "associatorNames",
    "references",
    "referenceNames",
    "classPathIsA",
    "newInstance",
    "newObjectPath",
    "newString",
    "newArray",
    "toString",
    "type test",
    "unsupported entry",
    "context.flush",
    "result.returnInstance",
    "result.returnObjectPath",
    "result.returnDone",
    "string.getCharPtr",
    "array.getSize",
    "array.getElementAt",
    "array.setElementAt",
    "enumeration.hasNext",
    "enumeration.getNext",
    "enumeration.toArray",
    "instance.getProperty",
    "instance.setProperty",
    "instance.getObjectPath",
    "instance.setPropertyFilter",
    "path.addKey",
    "path.getKey",
    "path.getClassName",
    "path.getNameSpace",
    "path.toString",
    "clone",
    "release",
    "other object entry",
};

}  // namespace

const char* entryName(Entry entry) {
    static_assert(std::size(entryNames) == static_cast<std::size_t>(Entry::OtherObjectCall) + 1);
    return entryNames[static_cast<std::size_t>(entry)];
}

bool isQuery(Entry entry) {
    return entry >= Entry::EnumerateInstanceNames && entry <= Entry::ReferenceNames;
}

bool isObjectEntry(Entry entry) {
    return entry >= Entry::ResultReturnInstance;
}

const char* kindName(ObjectKind kind) {
    static constexpr const char* names[] = {"context",     "result",   "string", "array",
                                            "enumeration", "instance", "path"};
    return names[static_cast<std::size_t>(kind)];
}

void Books::recordObjectCalls(bool on) {
    recordObjectCalls_ = on;
}

std::size_t Books::record(CallRecord record) {
    if (isObjectEntry(record.entry) && !recordObjectCalls_) return notKept;
    const std::lock_guard lock(mutex_);
    ++counts_[record.entry];
    if (!keepCalls_) return notKept;
    calls_.push_back(std::move(record));
    return firstIndex_ + calls_.size() - 1;
}

void Books::setRc(std::size_t index, CMPIrc rc) {
    const std::lock_guard lock(mutex_);
    // The call may have been cleared away while it was running.
    if (index == notKept || index < firstIndex_) return;
    const std::size_t position = index - firstIndex_;
    if (position < calls_.size()) calls_[position].rc = rc;
}

std::vector<CallRecord> Books::calls() const {
    const std::lock_guard lock(mutex_);
    return calls_;
}

std::vector<CallRecord> Books::queries() const {
    const std::lock_guard lock(mutex_);
    std::vector<CallRecord> found;
    std::copy_if(calls_.begin(), calls_.end(), std::back_inserter(found),
                 [](const CallRecord& call) { return isQuery(call.entry); });
    return found;
}

std::size_t Books::count(Entry entry) const {
    const std::lock_guard lock(mutex_);
    const auto found = counts_.find(entry);
    return found == counts_.end() ? 0 : found->second;
}

void Books::clearCalls() {
    const std::lock_guard lock(mutex_);
    firstIndex_ += calls_.size();
    calls_.clear();
    counts_.clear();
}

void Books::keepCalls(bool on) {
    const std::lock_guard lock(mutex_);
    keepCalls_ = on;
}

void Books::objectMade(const void* object, ObjectKind kind, bool isClone) {
    const std::lock_guard lock(mutex_);
    live_.insert_or_assign(object, LiveObject{kind, isClone, std::this_thread::get_id()});
}

bool Books::objectUsed(const void* object, const char* what) {
    const std::lock_guard lock(mutex_);
    if (live_.count(object) != 0) return true;
    misuses_.push_back(std::string(what) + " on an object that has ended");
    return false;
}

void Books::objectEnded(const void* object) {
    const std::lock_guard lock(mutex_);
    live_.erase(object);
}

std::optional<ObjectKind> Books::kindOf(const void* object) const {
    const std::lock_guard lock(mutex_);
    const auto found = live_.find(object);
    return found == live_.end() ? std::nullopt : std::optional(found->second.kind);
}

template <class Condition>
std::size_t Books::countLive(Condition condition) const {
    const std::lock_guard lock(mutex_);
    return static_cast<std::size_t>(std::count_if(
        live_.begin(), live_.end(), [&](const auto& entry) { return condition(entry.second); }));
}

std::size_t Books::live() const {
    return countLive([](const LiveObject&) { return true; });
}

std::size_t Books::live(ObjectKind kind) const {
    return countLive([&](const LiveObject& object) { return object.kind == kind; });
}

std::size_t Books::liveClones() const {
    return countLive([](const LiveObject& object) { return object.isClone; });
}

std::size_t Books::liveOnThread(std::thread::id thread) const {
    return countLive([&](const LiveObject& object) { return object.thread == thread; });
}

void Books::misuse(std::string what) {
    const std::lock_guard lock(mutex_);
    misuses_.push_back(std::move(what));
}

std::vector<std::string> Books::misuses() const {
    const std::lock_guard lock(mutex_);
    return misuses_;
}

}  // namespace testbed
