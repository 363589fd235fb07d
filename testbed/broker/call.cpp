// What a fault rule makes of a call's answer: refused, NULL, falsified or late.
#include "call.h"

#include <cstring>

#include "object_string.h"

namespace testbed {

CMPIData dataWithout(CMPIValueState state) {
    CMPIData data;
    std::memset(&data, 0, sizeof data);
    data.state = state;
    return data;
}

template <>
CMPIData refusal<CMPIData>() {
    return dataWithout(CMPI_badValue);
}

Call::Call(BrokerCore& core, CallRecord record) : core_(core), entry_(record.entry) {
    effect_ = core.faults.match(record);
    index_ = core.books.record(std::move(record));
    // The hook runs outside of all locks: it may ask this broker something.
    Faults::runHook(effect_);
    if (core.options.serialQueries && isQuery(entry_)) turn_ = std::unique_lock(core.queryMutex);
    core.faults.wait(effect_, isQuery(entry_));
    if (!isQuery(entry_)) return;
    if (core.stopGate.admits(core.options.whileStopping)) return;
    effect_.emplace();
    effect_->rc = CMPI_RC_ERR_FAILED;
}

bool Call::answersNull() const {
    if (!effect_) return false;
    if (effect_->nullResult) return true;
    if (effect_->keepResult) return false;
    if (effect_->rc != CMPI_RC_OK) return true;
    // A clone has no status that anybody must read: a rule that names nothing else means NULL.
    return entry_ == Entry::Clone && !effect_->hook && effect_->delay.count() == 0;
}

bool Call::wantsTruth() const {
    if (!effect_) return true;
    // A clone that nobody receives would be a leak.
    if (entry_ == Entry::Clone) return !answersNull();
    // An enumeration goes on to its next item even when it fails to hand this one out.
    return effect_->rc == CMPI_RC_OK || effect_->keepResult || entry_ == Entry::EnumerationGetNext;
}

void Call::falsify(CMPIData& result) const {
    if (!effect_) return;
    if (effect_->wrongType) {
        result = dataWithout(CMPI_goodValue);
        result.type = CMPI_uint32;
        result.value.uint32 = 4711;
        return;
    }
    if (!answersNull()) return;
    if (effect_->rc != CMPI_RC_OK) {
        result = refusal<CMPIData>();
        return;
    }
    // Status OK and no value, without a flag that says so.
    const CMPIType type = result.type;
    result = dataWithout(CMPI_goodValue);
    result.type = type;
}

void Call::conclude(CMPIStatus& outcome) const {
    if (effect_ && effect_->rc != CMPI_RC_OK) outcome = {effect_->rc, nullptr};
    if (effect_ && effect_->message) {
        outcome.msg = &makeInArena<StringObject>(core_, *effect_->message);
    }
    core_.books.setRc(index_, outcome.rc);
}

}  // namespace testbed
