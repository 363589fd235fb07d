// The broker's CMPIContext: entries by name, and the thread that it is good for.
#pragma once

#include <atomic>
#include <cstdint>
#include <memory>
#include <mutex>
#include <vector>

#include "cim_object.h"
#include "object.h"
#include "object_calls.h"

namespace testbed {

class ContextObject final : public Object, public CMPIContext {
public:
    ContextObject(BrokerCore& core, std::vector<NamedValue> entries);

    const void* handle() const override { return static_cast<const CMPIContext*>(this); }
    void describe(CallRecord& record) const override { record.context = handle(); }
    std::shared_ptr<ContextObject> copy() const;

    std::vector<NamedValue> entries() const;
    void setEntry(const char* name, CimValue value);

    /// The number of the thread that may use it; 0 for a prepared one that nobody attached with.
    std::uint64_t user() const { return user_; }
    void setUser(std::uint64_t thread) { user_ = thread; }
    /// Made by prepareAttachThread, thus to be ended by detachThread.
    bool isPrepared() const { return isPrepared_; }
    void setPrepared();

private:
    void drop() override;
    std::atomic<std::uint64_t> user_ = 0;
    std::atomic<bool> isPrepared_ = false;
    mutable std::mutex mutex_;
    std::vector<NamedValue> entries_;  // guarded by mutex_
};

template <>
struct ObjectOf<CMPIContext> {
    using Type = ContextObject;
};

}  // namespace testbed
