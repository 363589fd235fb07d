// The function table of arrays, and reading and setting their elements.
#include "object_array.h"

#include "conversions.h"
#include "object_enumeration.h"

namespace testbed {

namespace {

CMPICount getSize(const CMPIArray* array, CMPIStatus* status) {
    return answerOn<CMPICount>(
        array, Entry::ArrayGetSize, nullptr, status,
        [](ArrayObject& object, CMPIStatus&) { return static_cast<CMPICount>(object.size()); });
}

CMPIType getSimpleType(const CMPIArray* array, CMPIStatus* status) {
    return answerOn<CMPIType>(
        array, Entry::OtherObjectCall, nullptr, status,
        [](ArrayObject& object, CMPIStatus&) { return object.elementType(); });
}

CMPIData getElementAt(const CMPIArray* array, CMPICount index, CMPIStatus* status) {
    return answerOn<CMPIData>(
        array, Entry::ArrayGetElementAt, nullptr, status,
        [&](ArrayObject& object, CMPIStatus&) { return object.elementAt(index); });
}

CMPIStatus setElementAt(const CMPIArray* array, CMPICount index, const CMPIValue* value,
                        CMPIType type) {
    return statusOn(array, Entry::ArraySetElementAt, nullptr,
                    [&](ArrayObject& object) { return object.setElementAt(index, value, type); });
}

const CMPIArrayFT arrayTable = {
    .ftVersion = CMPI_VERSION,
    .release = releaseEntry<CMPIArray>,
    .clone = cloneEntry<CMPIArray>,
    .getSize = getSize,
    .getSimpleType = getSimpleType,
    .getElementAt = getElementAt,
    .setElementAt = setElementAt,
};

}  // namespace

ArrayObject::ArrayObject(BrokerCore& brokerCore, CMPIType elementType, std::vector<CimValue> values)
    : Object(brokerCore, ObjectKind::Array),
      CMPIArray{nullptr, &arrayTable},
      elementType_(CimValue::null(elementType).type),
      values_(std::move(values)) {
    hdl = this;
}

ArrayObject::ArrayObject(BrokerCore& brokerCore, CMPIType elementType,
                         std::vector<std::shared_ptr<Object>> items)
    : Object(brokerCore, ObjectKind::Array),
      CMPIArray{nullptr, &arrayTable},
      elementType_(elementType),
      items_(std::move(items)) {
    hdl = this;
}

std::shared_ptr<ArrayObject> ArrayObject::copy() const {
    if (items_.empty()) return std::make_shared<ArrayObject>(core(), elementType_, values_);
    auto array = std::make_shared<ArrayObject>(core(), elementType_, std::vector<CimValue>());
    for (const auto& item : items_) array->items_.push_back(copyItem(*array, *item));
    return array;
}

CMPIData ArrayObject::elementAt(std::size_t index) const {
    if (index >= size()) return dataWithout(CMPI_badValue);
    return items_.empty() ? toData(*this, values_[index]) : itemData(*items_[index]);
}

CMPIrc ArrayObject::setElementAt(std::size_t index, const CMPIValue* value, CMPIType type) {
    if (index >= values_.size()) return CMPI_RC_ERR_NO_SUCH_PROPERTY;
    if (type == CMPI_chars && core().options.refusesCharsInArrays) {
        values_[index] = CimValue::string("");
        return CMPI_RC_ERR_TYPE_MISMATCH;
    }
    CimValue element;
    const CMPIrc rc = readValue(value, type, element);
    if (rc != CMPI_RC_OK) return rc;
    if (element.type != elementType_) return CMPI_RC_ERR_FAILED;
    values_[index] = std::move(element);
    return CMPI_RC_OK;
}

void ArrayObject::drop() {
    values_.clear();
    items_.clear();
}

}  // namespace testbed
