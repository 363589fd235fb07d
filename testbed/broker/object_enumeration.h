// The broker's CMPIEnumeration, and the instances and paths in it.
#pragma once

#include <atomic>
#include <memory>
#include <vector>

#include "cim_object.h"
#include "object.h"
#include "object_array.h"
#include "object_calls.h"

namespace testbed {

/// The items are parts of the enumeration; walking it and reading it as an array hand out the same
/// objects and do not disturb each other.
class EnumerationObject final : public Object, public CMPIEnumeration {
public:
    EnumerationObject(BrokerCore& core, CMPIType itemType);

    const void* handle() const override { return static_cast<const CMPIEnumeration*>(this); }
    std::shared_ptr<EnumerationObject> copy() const;

    void fill(std::vector<Instance> instances);
    void fill(std::vector<ObjectPath> paths);
    bool hasNext() const { return position_ < items_.size(); }
    /// Past the end an item in state "bad value".
    CMPIData next();
    ArrayObject& toArray();

private:
    void drop() override;
    const CMPIType itemType_;
    std::vector<std::shared_ptr<Object>> items_;
    std::atomic<std::size_t> position_ = 0;
    std::mutex arrayMutex_;
    std::shared_ptr<ArrayObject> array_;  // guarded by arrayMutex_; made when first asked for
};

template <>
struct ObjectOf<CMPIEnumeration> {
    using Type = EnumerationObject;
};

/// An instance or path object as an item of an enumeration or array.
CMPIData itemData(Object& item);
/// A copy of such an item that belongs to `whole`.
std::shared_ptr<Object> copyItem(const Object& whole, const Object& item);

}  // namespace testbed
