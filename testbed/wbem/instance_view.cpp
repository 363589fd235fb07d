#include "instance_view.h"

#include <algorithm>

namespace testbed {
namespace {

bool knows(const std::vector<PropertyDefinition>& properties, const std::string& name) {
    return std::any_of(properties.begin(), properties.end(),
                       [&](const PropertyDefinition& entry) { return sameName(entry.name, name); });
}

}  // namespace

const InstanceView::Known& InstanceView::knownOf(const Instance& instance) {
    const ObjectPath& path = instance.path;
    const auto [entry, isNew] =
        classes_.try_emplace(foldName(path.nameSpace + ":" + path.className));
    if (!isNew) return entry->second;
    Known& known = entry->second;
    known.details.withQualifiers = options_.withQualifiers;
    known.details.withClassOrigin = options_.withClassOrigin;
    known.details.properties = repository_.allProperties(path.nameSpace, path.className);
    if (auto definition = repository_.findClass(path.nameSpace, path.className)) {
        known.details.qualifiers = std::move(definition->qualifiers);
        known.own = std::move(definition->properties);
    }
    return known;
}

bool InstanceView::isShown(const std::string& property, const Known& known) const {
    if (!knows(known.details.properties, property)) return true;
    return !options_.localOnly || knows(known.own, property);
}

void InstanceView::apply(Instance& instance) {
    const Known& known = knownOf(instance);
    const std::string& shallow = options_.shallowClass;
    std::vector<PropertyDefinition> wanted;
    if (!shallow.empty()) wanted = repository_.allProperties(instance.path.nameSpace, shallow);
    const bool isBelow = !wanted.empty() && !sameName(shallow, instance.path.className);
    std::erase_if(instance.properties, [&](const NamedValue& property) {
        return !isShown(property.first, known) || (isBelow && !knows(wanted, property.first));
    });
}

const InstanceDetails& InstanceView::detailsOf(const Instance& instance) {
    return knownOf(instance).details;
}

}  // namespace testbed
