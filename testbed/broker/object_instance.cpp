// The function table of instances, the property filter, and the check of a property's type.
#include "object_instance.h"

#include <algorithm>

#include "conversions.h"
#include "object_path.h"
#include "object_string.h"

namespace testbed {

namespace {

CMPIData getProperty(const CMPIInstance* instance, const char* name, CMPIStatus* status) {
    return answerOn<CMPIData>(instance, Entry::InstanceGetProperty, name, status,
                              [&](InstanceObject& object, CMPIStatus& outcome) {
                                  const CimValue* value =
                                      name ? object.content().find(name) : nullptr;
                                  if (value != nullptr) return toData(object, *value);
                                  outcome.rc = CMPI_RC_ERR_NOT_FOUND;
                                  return dataWithout(CMPI_notFound);
                              });
}

CMPIData getPropertyAt(const CMPIInstance* instance, CMPICount index, CMPIString** name,
                       CMPIStatus* status) {
    return answerOn<CMPIData>(instance, Entry::OtherObjectCall, nullptr, status,
                              [&](InstanceObject& object, CMPIStatus& outcome) {
                                  const auto& properties = object.content().properties;
                                  if (index >= properties.size()) {
                                      outcome.rc = CMPI_RC_ERR_NO_SUCH_PROPERTY;
                                      return dataWithout(CMPI_notFound);
                                  }
                                  if (name != nullptr) {
                                      *name = derivedString(object, properties[index].first);
                                  }
                                  return toData(object, properties[index].second);
                              });
}

CMPICount getPropertyCount(const CMPIInstance* instance, CMPIStatus* status) {
    return answerOn<CMPICount>(
        instance, Entry::OtherObjectCall, nullptr, status, [](InstanceObject& object, CMPIStatus&) {
            return static_cast<CMPICount>(object.content().properties.size());
        });
}

CMPIStatus setProperty(const CMPIInstance* instance, const char* name, const CMPIValue* value,
                       CMPIType type) {
    return statusOn(instance, Entry::InstanceSetProperty, name,
                    [&](InstanceObject& object) { return object.set(name, value, type); });
}

CMPIObjectPath* getObjectPath(const CMPIInstance* instance, CMPIStatus* status) {
    return answerOn<CMPIObjectPath*>(instance, Entry::InstanceGetObjectPath, nullptr, status,
                                     [](InstanceObject& object, CMPIStatus&) -> CMPIObjectPath* {
                                         return &makeDerived<PathObject>(object,
                                                                         object.content().path);
                                     });
}

CMPIStatus setPropertyFilter(const CMPIInstance* instance, const char** properties,
                             const char** keys) {
    return statusOn(instance, Entry::InstanceSetPropertyFilter, nullptr,
                    [&](InstanceObject& object) {
                        object.setFilter(properties, keys);
                        return CMPI_RC_OK;
                    });
}

CMPIStatus setObjectPath(const CMPIInstance* instance, const CMPIObjectPath* path) {
    return statusOn(instance, Entry::OtherObjectCall, nullptr, [&](InstanceObject& object) {
        const PathObject* source = usable(path, Entry::OtherObjectCall);
        if (source == nullptr) return CMPI_RC_ERR_INVALID_PARAMETER;
        object.setPath(source->content());
        return CMPI_RC_OK;
    });
}

const CMPIInstanceFT instanceTable = {
    .ftVersion = CMPI_VERSION,
    .release = releaseEntry<CMPIInstance>,
    .clone = cloneEntry<CMPIInstance>,
    .getProperty = getProperty,
    .getPropertyAt = getPropertyAt,
    .getPropertyCount = getPropertyCount,
    .setProperty = setProperty,
    .getObjectPath = getObjectPath,
    .setPropertyFilter = setPropertyFilter,
    .setObjectPath = setObjectPath,
};

}  // namespace

InstanceObject::InstanceObject(BrokerCore& brokerCore, Instance content)
    : Object(brokerCore, ObjectKind::Instance),
      CMPIInstance{nullptr, &instanceTable},
      content_(std::move(content)) {
    hdl = this;
}

void InstanceObject::describe(CallRecord& record) const {
    record.path = content_.path.text();
    record.className = content_.path.className;
}

std::shared_ptr<InstanceObject> InstanceObject::copy() const {
    auto instance = std::make_shared<InstanceObject>(core(), content_);
    instance->filter_ = filter_;
    return instance;
}

bool InstanceObject::isHidden(const std::string& name) const {
    return filter_ && std::none_of(filter_->begin(), filter_->end(),
                                   [&](const std::string& shown) { return sameName(shown, name); });
}

void InstanceObject::setFilter(const char** properties, const char** keys) {
    filter_ = readNames(properties);
    if (!filter_) return;
    const std::vector<std::string> keyNames = readNames(keys).value_or(std::vector<std::string>());
    filter_->insert(filter_->end(), keyNames.begin(), keyNames.end());
    if (core().options.filteredKeys == FilteredKeys::Stay && keys == nullptr) {
        for (const auto& [name, value] : content_.path.keys) filter_->push_back(name);
    }
    std::erase_if(content_.properties,
                  [&](const NamedValue& property) { return isHidden(property.first); });
}

CMPIrc InstanceObject::checkType(const std::string& name, const CimValue& value) const {
    const auto& [nameSpace, className, keys, host] = content_.path;
    const bool strict = core().options.strictProperties;
    if (!core().repository.hasClass(nameSpace, className)) return CMPI_RC_OK;
    const auto definition = core().repository.findProperty(nameSpace, className, name);
    if (!definition) return strict ? CMPI_RC_ERR_NO_SUCH_PROPERTY : CMPI_RC_OK;
    const CMPIType declared = CimValue::null(definition->type).type;
    const bool fits = value.isNull || value.type == declared;
    const bool numberForText = declared == CMPI_string && isNumeric(value.type);
    return !fits && (strict || numberForText) ? CMPI_RC_ERR_TYPE_MISMATCH : CMPI_RC_OK;
}

CMPIrc InstanceObject::set(const char* name, const CMPIValue* value, CMPIType type) {
    if (name == nullptr || *name == '\0') return CMPI_RC_ERR_INVALID_PARAMETER;
    CimValue property;
    CMPIrc rc = readValue(value, type, property);
    if (rc != CMPI_RC_OK || isHidden(name)) return rc;
    rc = checkType(name, property);
    if (rc == CMPI_RC_OK) content_.set(name, std::move(property));
    return rc;
}

Instance InstanceObject::returned() const {
    Instance instance = content_;
    if (core().options.filteredKeys == FilteredKeys::NamesGoToo) {
        std::erase_if(instance.path.keys,
                      [&](const NamedValue& key) { return isHidden(key.first); });
    }
    return instance;
}

void InstanceObject::drop() {
    content_ = {};
    filter_.reset();
}

}  // namespace testbed
