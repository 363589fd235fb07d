// One call of a table entry: noted in the books, looked up in the fault rules, then answered.
#pragma once

#include <mutex>
#include <utility>

#include "broker_core.h"

namespace testbed {

inline constexpr CMPIStatus statusOk = {CMPI_RC_OK, nullptr};

/// The result of calls that answer with nothing but a status.
struct Nothing {};

/// What a refused call answers besides its status: NULL, zero, or a bad value.
template <class Result>
Result refusal() {
    return Result{};
}
template <>
CMPIData refusal<CMPIData>();

/// A data item without value in that state.
CMPIData dataWithout(CMPIValueState state);

/// Notes the call, finds its fault rule, runs the rule's hook and waits, also while the manager
/// stops. While it lives it holds the query mutex, when queries are serial.
class Call {
public:
    Call(BrokerCore& core, CallRecord record);

    /// Whether the true answer has to be worked out.
    bool wantsTruth() const;
    /// Puts the rule's lie in place of the true result.
    template <class Result>
    void falsify(Result& result) const {
        if (answersNull()) result = refusal<Result>();
    }
    void falsify(CMPIData& result) const;
    /// Puts the rule's status in place of the true one and notes the outcome.
    void conclude(CMPIStatus& outcome) const;

private:
    bool answersNull() const;

    BrokerCore& core_;
    const Entry entry_;
    std::size_t index_;
    FaultEffect effect_;
    std::unique_lock<std::mutex> turn_;
};

/// Writes a call's outcome where its caller wants it.
inline void tellOutcome(const BrokerCore& core, CMPIStatus* status, const CMPIStatus& outcome) {
    const bool silent = core.options.silentSuccess && outcome.rc == CMPI_RC_OK;
    if (status != nullptr && !silent) *status = outcome;
}

/// Answers one call. `truth(outcome)` gives the true result and sets the status when it is not OK.
template <class Result, class Truth>
Result answer(BrokerCore& core, CallRecord record, CMPIStatus* status, Truth&& truth) {
    const Call call(core, std::move(record));
    CMPIStatus outcome = statusOk;
    Result result = refusal<Result>();
    if (call.wantsTruth()) result = truth(outcome);
    call.falsify(result);
    call.conclude(outcome);
    tellOutcome(core, status, outcome);
    return result;
}

/// Writes a refusal that needs neither books nor rules.
template <class Result>
Result refuse(CMPIStatus* status, CMPIrc rc) {
    if (status != nullptr) *status = {rc, nullptr};
    return refusal<Result>();
}

}  // namespace testbed
