#include "held_vendor.h"

namespace bench {

using testbed::Entry;

HeldVendor::HeldVendor(testbed::Broker& broker, std::chrono::milliseconds answerTime)
    : answerTime_(answerTime) {
    constexpr Entry kQueries[] = {
        Entry::EnumerateInstanceNames,
        Entry::EnumerateInstances,
        Entry::GetInstance,
        Entry::Associators,
        Entry::AssociatorNames,
        Entry::References,
        Entry::ReferenceNames,
    };
    for (Entry entry : kQueries) {
        testbed::FaultRule rule;
        rule.entry = entry;
        rule.hook = [this] { hold(); };
        broker.faults().add(rule);
    }
}

void HeldVendor::hold() {
    std::unique_lock lock(mutex_);
    if (released_) return;
    const std::uint64_t passed = passed_;
    waiting_++;
    changed_.notify_all();
    changed_.wait_for(lock, answerTime_, [&] { return released_ || passed_ != passed; });
    if (passed_ == passed) waiting_--;  // the answer came by itself
}

int HeldVendor::letThrough() {
    const std::lock_guard lock(mutex_);
    const int count = waiting_;
    waiting_ = 0;
    passed_++;
    changed_.notify_all();
    return count;
}

bool HeldVendor::waitForQuery(std::chrono::milliseconds limit) {
    std::unique_lock lock(mutex_);
    return changed_.wait_for(lock, limit, [&] { return waiting_ > 0; });
}

void HeldVendor::answerIn(std::chrono::milliseconds answerTime) {
    const std::lock_guard lock(mutex_);
    answerTime_ = answerTime;
    released_ = answerTime.count() == 0;
}

void HeldVendor::release() {
    const std::lock_guard lock(mutex_);
    released_ = true;
    waiting_ = 0;
    passed_++;
    changed_.notify_all();
}

}  // namespace bench
