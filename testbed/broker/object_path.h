// The broker's CMPIObjectPath.
#pragma once

#include <memory>
#include <string>

#include "cim_object.h"
#include "object.h"
#include "object_calls.h"

namespace testbed {

class PathObject final : public Object, public CMPIObjectPath {
public:
    PathObject(BrokerCore& core, ObjectPath content);

    const void* handle() const override { return static_cast<const CMPIObjectPath*>(this); }
    void describe(CallRecord& record) const override;
    std::shared_ptr<PathObject> copy() const;

    const ObjectPath& content() const { return content_; }
    ObjectPath& content() { return content_; }
    CMPIrc addKey(const char* name, const CMPIValue* value, CMPIType type);

private:
    void drop() override;
    ObjectPath content_;
};

template <>
struct ObjectOf<CMPIObjectPath> {
    using Type = PathObject;
};

}  // namespace testbed
