// The broker's CMPIInstance.
#pragma once

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "cim_object.h"
#include "object.h"
#include "object_calls.h"

namespace testbed {

class InstanceObject final : public Object, public CMPIInstance {
public:
    InstanceObject(BrokerCore& core, Instance content);

    const void* handle() const override { return static_cast<const CMPIInstance*>(this); }
    void describe(CallRecord& record) const override;
    std::shared_ptr<InstanceObject> copy() const;

    const Instance& content() const { return content_; }
    /// What a client receives of it.
    Instance returned() const;
    /// A property that the filter hides is dropped without an error.
    CMPIrc set(const char* name, const CMPIValue* value, CMPIType type);
    /// From now on only the named properties exist; NULL-terminated lists, NULL: no filter.
    void setFilter(const char** properties, const char** keys);
    void setPath(ObjectPath path) { content_.path = std::move(path); }

private:
    void drop() override;
    bool isHidden(const std::string& name) const;
    /// What the class says against a value for that property.
    CMPIrc checkType(const std::string& name, const CimValue& value) const;

    Instance content_;
    std::optional<std::vector<std::string>> filter_;
};

template <>
struct ObjectOf<CMPIInstance> {
    using Type = InstanceObject;
};

}  // namespace testbed
