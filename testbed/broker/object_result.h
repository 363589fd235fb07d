// The broker's CMPIResult: what a provider hands back to its caller.
#pragma once

#include <memory>

#include "broker.h"
#include "object.h"
#include "object_calls.h"

namespace testbed {

class ResultObject final : public Object, public CMPIResult {
public:
    ResultObject(BrokerCore& core, Broker::Collected& collected);

    const void* handle() const override { return static_cast<const CMPIResult*>(this); }
    /// The copy collects into the same place.
    std::shared_ptr<ResultObject> copy() const;
    Broker::Collected& collected() { return *collected_; }

private:
    void drop() override { collected_ = nullptr; }
    Broker::Collected* collected_;
};

template <>
struct ObjectOf<CMPIResult> {
    using Type = ResultObject;
};

}  // namespace testbed
