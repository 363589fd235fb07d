// The broker's CMPIArray.
#pragma once

#include <memory>
#include <vector>

#include "cim_value.h"
#include "object.h"
#include "object_calls.h"

namespace testbed {

/// An array of plain values, or of objects that an enumeration owns.
class ArrayObject final : public Object, public CMPIArray {
public:
    ArrayObject(BrokerCore& core, CMPIType elementType, std::vector<CimValue> values);
    ArrayObject(BrokerCore& core, CMPIType elementType, std::vector<std::shared_ptr<Object>> items);

    const void* handle() const override { return static_cast<const CMPIArray*>(this); }
    /// The copy of an array of objects has copies of the objects.
    std::shared_ptr<ArrayObject> copy() const;

    /// Without the array flag; texts are CMPI_string.
    CMPIType elementType() const { return elementType_; }
    std::size_t size() const { return items_.empty() ? values_.size() : items_.size(); }
    CMPIData elementAt(std::size_t index) const;
    CMPIrc setElementAt(std::size_t index, const CMPIValue* value, CMPIType type);
    const std::vector<CimValue>& values() const { return values_; }

private:
    void drop() override;
    const CMPIType elementType_;
    std::vector<CimValue> values_;
    std::vector<std::shared_ptr<Object>> items_;
};

template <>
struct ObjectOf<CMPIArray> {
    using Type = ArrayObject;
};

}  // namespace testbed
