// The function table of enumerations, walking one, and its array.
#include "object_enumeration.h"

#include "object_instance.h"
#include "object_path.h"

namespace testbed {

namespace {

CMPIData getNext(const CMPIEnumeration* enumeration, CMPIStatus* status) {
    return answerOn<CMPIData>(enumeration, Entry::EnumerationGetNext, nullptr, status,
                              [](EnumerationObject& object, CMPIStatus&) { return object.next(); });
}

CMPIBoolean hasNext(const CMPIEnumeration* enumeration, CMPIStatus* status) {
    return answerOn<CMPIBoolean>(enumeration, Entry::EnumerationHasNext, nullptr, status,
                                 [](EnumerationObject& object, CMPIStatus&) {
                                     return static_cast<CMPIBoolean>(object.hasNext());
                                 });
}

CMPIArray* toArray(const CMPIEnumeration* enumeration, CMPIStatus* status) {
    return answerOn<CMPIArray*>(
        enumeration, Entry::EnumerationToArray, nullptr, status,
        [](EnumerationObject& object, CMPIStatus&) -> CMPIArray* { return &object.toArray(); });
}

const CMPIEnumerationFT enumerationTable = {
    .ftVersion = CMPI_VERSION,
    .release = releaseEntry<CMPIEnumeration>,
    .clone = cloneEntry<CMPIEnumeration>,
    .getNext = getNext,
    .hasNext = hasNext,
    .toArray = toArray,
};

}  // namespace

EnumerationObject::EnumerationObject(BrokerCore& brokerCore, CMPIType itemType)
    : Object(brokerCore, ObjectKind::Enumeration),
      CMPIEnumeration{nullptr, &enumerationTable},
      itemType_(itemType) {
    hdl = this;
}

std::shared_ptr<EnumerationObject> EnumerationObject::copy() const {
    auto enumeration = std::make_shared<EnumerationObject>(core(), itemType_);
    for (const auto& item : items_) enumeration->items_.push_back(copyItem(*enumeration, *item));
    enumeration->position_ = position_.load();
    return enumeration;
}

void EnumerationObject::fill(std::vector<Instance> instances) {
    for (Instance& instance : instances) {
        items_.push_back(makePart<InstanceObject>(*this, std::move(instance)));
    }
}

void EnumerationObject::fill(std::vector<ObjectPath> paths) {
    for (ObjectPath& path : paths) {
        items_.push_back(makePart<PathObject>(*this, std::move(path)));
    }
}

CMPIData EnumerationObject::next() {
    if (!hasNext()) return dataWithout(CMPI_badValue);
    return itemData(*items_[position_++]);
}

ArrayObject& EnumerationObject::toArray() {
    const std::lock_guard lock(arrayMutex_);
    if (!array_) array_ = makePart<ArrayObject>(*this, itemType_, items_);
    return *array_;
}

void EnumerationObject::drop() {
    const std::lock_guard lock(arrayMutex_);
    array_.reset();
    items_.clear();
}

CMPIData itemData(Object& item) {
    CMPIData data = dataWithout(CMPI_goodValue);
    if (item.kind() == ObjectKind::Instance) {
        data.type = CMPI_instance;
        data.value.inst = static_cast<InstanceObject*>(&item);
    } else {
        data.type = CMPI_ref;
        data.value.ref = static_cast<PathObject*>(&item);
    }
    return data;
}

std::shared_ptr<Object> copyItem(const Object& whole, const Object& item) {
    if (item.kind() == ObjectKind::Instance) {
        return makePart<InstanceObject>(whole, static_cast<const InstanceObject&>(item).content());
    }
    return makePart<PathObject>(whole, static_cast<const PathObject&>(item).content());
}

}  // namespace testbed
