// Leaving out the properties of subclasses, and looking up once for each class what it knows.
#include "instance_view.h"

#include <algorithm>

namespace testbed {
namespace {

bool knows(const std::vector<PropertyDefinition>& properties, const std::string& name) {
    return std::any_of(properties.begin(), properties.end(),
                       [&](const PropertyDefinition& entry) { return sameName(entry.name, name); });
}

}  // namespace

void InstanceView::apply(Instance& instance) {
    const std::string& shallow = options_.shallowClass;
    if (shallow.empty() || sameName(shallow, instance.path.className)) return;
    const auto wanted = repository_.allProperties(instance.path.nameSpace, shallow);
    if (wanted.empty()) return;
    std::erase_if(instance.properties,
                  [&](const NamedValue& property) { return !knows(wanted, property.first); });
}

const InstanceDetails& InstanceView::detailsOf(const Instance& instance) {
    const ObjectPath& path = instance.path;
    const auto [entry, isNew] =
        classes_.try_emplace(foldName(path.nameSpace + ":" + path.className));
    InstanceDetails& details = entry->second;
    if (!isNew) return details;
    details.withQualifiers = options_.withQualifiers;
    details.withClassOrigin = options_.withClassOrigin;
    details.properties = repository_.allProperties(path.nameSpace, path.className);
    if (auto definition = repository_.findClass(path.nameSpace, path.className)) {
        details.qualifiers = std::move(definition->qualifiers);
    }
    return details;
}

}  // namespace testbed
