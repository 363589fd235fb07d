// Namespaces, classes with what they inherit, and the instances.
#include "repository.h"

#include <algorithm>
#include <mutex>

namespace testbed {

void Repository::addNamespace(std::string_view nameSpace) {
    const std::unique_lock lock(mutex_);
    if (space(nameSpace) != nullptr) return;
    const auto place = std::upper_bound(
        spaces_.begin(), spaces_.end(), foldName(nameSpace),
        [](const std::string& name, const Space& known) { return name < foldName(known.name); });
    spaces_.insert(place, Space{std::string(nameSpace), {}, {}});
}

bool Repository::hasNamespace(std::string_view nameSpace) const {
    const std::shared_lock lock(mutex_);
    return space(nameSpace) != nullptr;
}

std::vector<std::string> Repository::namespaceNames() const {
    const std::shared_lock lock(mutex_);
    std::vector<std::string> names;
    for (const Space& known : spaces_) names.push_back(known.name);
    return names;
}

const Repository::Space* Repository::space(std::string_view nameSpace) const {
    // There are few of them.
    const auto found = std::find_if(spaces_.begin(), spaces_.end(), [&](const Space& known) {
        return sameName(known.name, nameSpace);
    });
    return found == spaces_.end() ? nullptr : &*found;
}

void Repository::defineClass(std::string_view nameSpace, ClassDefinition definition) {
    addNamespace(nameSpace);
    const std::unique_lock lock(mutex_);
    Space& home = const_cast<Space&>(*space(nameSpace));
    const auto [place, isNew] = home.classes.try_emplace(definition.name);
    if (isNew) home.classOrder.push_back(definition.name);
    place->second = std::move(definition);
}

bool Repository::hasClass(std::string_view nameSpace, std::string_view className) const {
    const std::shared_lock lock(mutex_);
    return classLocked(nameSpace, className) != nullptr;
}

const ClassDefinition* Repository::classLocked(std::string_view nameSpace,
                                               std::string_view className) const {
    const Space* home = space(nameSpace);
    return home == nullptr ? nullptr : classIn(*home, className);
}

const ClassDefinition* Repository::classIn(const Space& home, std::string_view className) {
    const auto found = home.classes.find(className);
    return found == home.classes.end() ? nullptr : &found->second;
}

std::optional<ClassDefinition> Repository::findClass(std::string_view nameSpace,
                                                     std::string_view className) const {
    const std::shared_lock lock(mutex_);
    const ClassDefinition* definition = classLocked(nameSpace, className);
    return definition ? std::optional(*definition) : std::nullopt;
}

std::vector<const ClassDefinition*> Repository::lineageLocked(std::string_view nameSpace,
                                                              std::string_view className) const {
    std::vector<const ClassDefinition*> lineage;
    const ClassDefinition* definition = classLocked(nameSpace, className);
    while (definition != nullptr) {
        // A hierarchy that bites its tail ends where it would begin again.
        if (std::find(lineage.begin(), lineage.end(), definition) != lineage.end()) break;
        lineage.push_back(definition);
        definition = classLocked(nameSpace, definition->superclass);
    }
    return lineage;
}

std::vector<const PropertyDefinition*> Repository::propertiesLocked(
    std::string_view nameSpace, std::string_view className) const {
    std::vector<const PropertyDefinition*> properties;
    auto lineage = lineageLocked(nameSpace, className);
    std::reverse(lineage.begin(), lineage.end());
    for (const ClassDefinition* definition : lineage) {
        for (const PropertyDefinition& own : definition->properties) {
            const auto inherited = std::find_if(
                properties.begin(), properties.end(),
                [&](const auto* property) { return sameName(property->name, own.name); });
            if (inherited != properties.end()) {
                *inherited = &own;
            } else {
                properties.push_back(&own);
            }
        }
    }
    return properties;
}

std::vector<PropertyDefinition> Repository::allProperties(std::string_view nameSpace,
                                                          std::string_view className) const {
    const std::shared_lock lock(mutex_);
    std::vector<PropertyDefinition> properties;
    for (const PropertyDefinition* known : propertiesLocked(nameSpace, className)) {
        properties.push_back(*known);
    }
    return properties;
}

std::vector<KeyDefinition> Repository::keys(std::string_view nameSpace,
                                            std::string_view className) const {
    const std::shared_lock lock(mutex_);
    std::vector<KeyDefinition> keys;
    for (const PropertyDefinition* known : propertiesLocked(nameSpace, className)) {
        if (known->isKey) keys.push_back({known->name, known->type});
    }
    return keys;
}

std::optional<PropertyDefinition> Repository::findProperty(std::string_view nameSpace,
                                                           std::string_view className,
                                                           std::string_view name) const {
    const std::shared_lock lock(mutex_);
    for (const ClassDefinition* definition : lineageLocked(nameSpace, className)) {
        for (const PropertyDefinition& property : definition->properties) {
            if (sameName(property.name, name)) return property;
        }
    }
    return std::nullopt;
}

std::vector<MethodDefinition> Repository::allMethods(std::string_view nameSpace,
                                                     std::string_view className) const {
    const std::shared_lock lock(mutex_);
    std::vector<MethodDefinition> methods;
    auto lineage = lineageLocked(nameSpace, className);
    std::reverse(lineage.begin(), lineage.end());
    for (const ClassDefinition* definition : lineage) {
        for (const MethodDefinition& own : definition->methods) {
            std::erase_if(methods, [&](const MethodDefinition& inherited) {
                return sameName(inherited.name, own.name);
            });
            methods.push_back(own);
        }
    }
    return methods;
}

bool Repository::knowsClass(std::string_view className) const {
    const std::shared_lock lock(mutex_);
    return std::any_of(spaces_.begin(), spaces_.end(),
                       [&](const Space& known) { return classIn(known, className) != nullptr; });
}

std::vector<std::string> Repository::classNames(std::string_view nameSpace) const {
    const std::shared_lock lock(mutex_);
    const Space* home = space(nameSpace);
    return home ? home->classOrder : std::vector<std::string>();
}

bool Repository::isA(std::string_view nameSpace, std::string_view className,
                     std::string_view ancestor) const {
    const std::shared_lock lock(mutex_);
    return isALocked(nameSpace, className, ancestor);
}

bool Repository::isALocked(std::string_view nameSpace, std::string_view className,
                           std::string_view ancestor) const {
    const Space* home = space(nameSpace);
    if (home == nullptr) return false;
    const ClassDefinition* definition = classIn(*home, className);
    // As many steps as there are classes, in a hierarchy that bites its tail.
    for (std::size_t i = 0; definition != nullptr && i < home->classes.size(); i++) {
        if (sameName(definition->name, ancestor)) return true;
        definition = classIn(*home, definition->superclass);
    }
    return false;
}

void Repository::put(Instance instance) {
    const std::string identity = instance.path.identity();
    const std::unique_lock lock(mutex_);
    const auto [position, isNew] = index_.try_emplace(identity, instances_.size());
    if (isNew) {
        instances_.push_back(std::move(instance));
    } else {
        instances_[position->second] = std::move(instance);
    }
}

bool Repository::remove(const ObjectPath& path) {
    const std::unique_lock lock(mutex_);
    const auto found = index_.find(path.identity());
    if (found == index_.end()) return false;
    const std::size_t removed = found->second;
    instances_.erase(instances_.begin() + static_cast<std::ptrdiff_t>(removed));
    index_.erase(found);
    for (auto& [identity, position] : index_) {
        if (position > removed) --position;
    }
    return true;
}

const Instance* Repository::instanceLocked(const std::string& identity) const {
    const auto found = index_.find(identity);
    return found == index_.end() ? nullptr : &instances_[found->second];
}

std::optional<Instance> Repository::get(const ObjectPath& path) const {
    const std::shared_lock lock(mutex_);
    const Instance* instance = instanceLocked(path.identity());
    return instance ? std::optional(*instance) : std::nullopt;
}

bool Repository::setProperty(const ObjectPath& path, std::string_view name, CimValue value) {
    const std::unique_lock lock(mutex_);
    const auto found = index_.find(path.identity());
    if (found == index_.end()) return false;
    instances_[found->second].set(name, std::move(value));
    return true;
}

bool Repository::eraseProperty(const ObjectPath& path, std::string_view name) {
    const std::unique_lock lock(mutex_);
    const auto found = index_.find(path.identity());
    if (found == index_.end()) return false;
    instances_[found->second].erase(name);
    return true;
}

std::vector<Instance> Repository::enumerate(std::string_view nameSpace,
                                            std::string_view className) const {
    const std::shared_lock lock(mutex_);
    std::vector<Instance> found;
    for (const Instance& instance : instances_) {
        if (!sameName(instance.path.nameSpace, nameSpace)) continue;
        if (isALocked(nameSpace, instance.path.className, className)) found.push_back(instance);
    }
    return found;
}

void Repository::clearInstances() {
    const std::unique_lock lock(mutex_);
    instances_.clear();
    index_.clear();
    associations_.clear();
    ends_.clear();
}

}  // namespace testbed
