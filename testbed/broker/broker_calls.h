// How the entries of the broker's own tables are answered.
#pragma once

#include <optional>
#include <utility>

#include "call.h"
#include "cim_object.h"

namespace testbed {

inline BrokerCore& coreOf(const CMPIBroker* broker) {
    return *static_cast<BrokerCore*>(const_cast<void*>(broker->hdl));
}

/// Whether an entry may be answered on this thread. Notes as misuses: a thread that is neither in a
/// manager call nor attached; a missing context, one that has ended (only then the call has to be
/// refused), one that was never attached or belongs to another thread.
bool admitUpCall(BrokerCore& core, const CMPIContext* ctx, Entry entry);
/// The same for entries that take no context.
void admitUpCall(BrokerCore& core, Entry entry);

/// The content of a path that a caller passed; nothing for NULL and for an ended one.
std::optional<ObjectPath> readPath(const CMPIObjectPath* path, Entry entry);

/// The record of a call on `path`, made by this thread.
CallRecord describeCall(Entry entry, const std::optional<ObjectPath>& path = {});

/// Answers an entry that has no context with `truth(core, outcome)`.
template <class Result, class Truth>
Result answerBroker(const CMPIBroker* broker, CallRecord record, CMPIStatus* status,
                    Truth&& truth) {
    BrokerCore& core = coreOf(broker);
    admitUpCall(core, record.entry);
    return answer<Result>(core, std::move(record), status,
                          [&](CMPIStatus& outcome) { return truth(core, outcome); });
}

/// Answers an entry that is called with a context.
template <class Result, class Truth>
Result answerUpCall(const CMPIBroker* broker, const CMPIContext* ctx, CallRecord record,
                    CMPIStatus* status, Truth&& truth) {
    BrokerCore& core = coreOf(broker);
    const bool admitted = admitUpCall(core, ctx, record.entry);
    record.context = ctx;
    return answer<Result>(core, std::move(record), status, [&](CMPIStatus& outcome) {
        if (admitted) return truth(core, outcome);
        outcome.rc = CMPI_RC_ERR_INVALID_HANDLE;
        return refusal<Result>();
    });
}

}  // namespace testbed
