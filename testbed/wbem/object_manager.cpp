// Dividing operations between provider and repository, and joining their answers.
#include "object_manager.h"

#include <algorithm>
#include <iterator>

#include "cim_status.h"
#include "interop_objects.h"

namespace testbed {
namespace {

/// The response, unless it is a failure.
Response checked(Response response) {
    if (response.rc != CMPI_RC_OK) throw providerStatus(response.rc, response.message.value_or(""));
    return response;
}

template <class Element>
void append(std::vector<Element>& list, std::vector<Element> more) {
    std::move(more.begin(), more.end(), std::back_inserter(list));
}

bool contains(const std::vector<std::string>& names, const std::string& name) {
    return std::any_of(names.begin(), names.end(),
                       [&](const std::string& known) { return sameName(known, name); });
}

}  // namespace

void restrictTo(const PropertyList& properties, Instance& instance) {
    if (!properties) return;
    std::erase_if(instance.properties, [&](const NamedValue& property) {
        return !contains(*properties, property.first);
    });
}

ObjectManager::ObjectManager(Repository& repository, std::optional<Registration> provider,
                             std::string system)
    : repository_(repository), provider_(std::move(provider)), system_(std::move(system)) {
    defineInteropClasses(repository_);
}

void ObjectManager::requireNamespace(const std::string& nameSpace) const {
    if (!repository_.hasNamespace(nameSpace)) {
        throw CimStatus(CMPI_RC_ERR_INVALID_NAMESPACE, "no namespace " + nameSpace);
    }
}

void ObjectManager::requireClass(const std::string& nameSpace, const std::string& className) const {
    requireNamespace(nameSpace);
    if (!repository_.hasClass(nameSpace, className) && !isProviderClass(nameSpace, className)) {
        throw CimStatus(CMPI_RC_ERR_INVALID_CLASS, "no class " + className + " in " + nameSpace);
    }
}

bool ObjectManager::isProviderClass(const std::string& nameSpace,
                                    const std::string& className) const {
    return provider_ && sameName(provider_->nameSpace, nameSpace) &&
           contains(provider_->classes, className);
}

std::vector<std::string> ObjectManager::providerClasses(const std::string& nameSpace,
                                                        const std::string& className) const {
    if (isProviderClass(nameSpace, className)) return {className};
    std::vector<std::string> classes;
    if (!provider_ || !sameName(provider_->nameSpace, nameSpace)) return classes;
    for (const std::string& registered : provider_->classes) {
        if (repository_.isA(nameSpace, registered, className)) classes.push_back(registered);
    }
    return classes;
}

std::vector<Instance> ObjectManager::staticInstances(const std::string& nameSpace,
                                                     const std::string& className) const {
    std::vector<Instance> found = repository_.enumerate(nameSpace, className);
    append(found, repository_.associationInstances(nameSpace, className));
    append(found, interopInstances(repository_, nameSpace, className, system_));
    return found;
}

std::optional<Instance> ObjectManager::staticInstance(const ObjectPath& path) const {
    if (auto found = repository_.get(path)) return found;
    for (Instance& instance : staticInstances(path.nameSpace, path.className)) {
        if (instance.path == path) return std::move(instance);
    }
    return std::nullopt;
}

void ObjectManager::requireKnown(const char* parameter,
                                 const std::optional<std::string>& className) const {
    // An association may lead into a namespace with classes of its own.
    if (className && !className->empty() && !repository_.knowsClass(*className)) {
        throw CimStatus(CMPI_RC_ERR_INVALID_PARAMETER,
                        std::string(parameter) + ": no class " + *className);
    }
}

std::vector<ObjectPath> ObjectManager::instanceNames(const std::string& nameSpace,
                                                     const std::string& className) const {
    requireClass(nameSpace, className);
    std::vector<ObjectPath> names;
    for (const std::string& served : providerClasses(nameSpace, className)) {
        InstanceClient client = provider_->client;
        append(names, checked(client.enumerateInstanceNames(served, nameSpace)).paths);
    }
    for (Instance& instance : staticInstances(nameSpace, className)) {
        names.push_back(std::move(instance.path));
    }
    return names;
}

std::vector<Instance> ObjectManager::instances(const std::string& nameSpace,
                                               const std::string& className,
                                               const PropertyList& properties) const {
    requireClass(nameSpace, className);
    std::vector<Instance> found;
    for (const std::string& served : providerClasses(nameSpace, className)) {
        InstanceClient client = provider_->client;
        append(found, checked(client.enumerateInstances(served, properties, nameSpace)).instances);
    }
    for (Instance& instance : staticInstances(nameSpace, className)) {
        restrictTo(properties, instance);
        found.push_back(std::move(instance));
    }
    return found;
}

Instance ObjectManager::instance(const ObjectPath& path, const PropertyList& properties) const {
    requireClass(path.nameSpace, path.className);
    if (isProviderClass(path.nameSpace, path.className)) {
        InstanceClient client = provider_->client;
        Response response = checked(client.getInstance(path, properties));
        // More than one instance is a provider's mistake that managers do not show to clients.
        if (!response.instances.empty()) return std::move(response.instances.front());
    } else if (auto found = staticInstance(path)) {
        restrictTo(properties, *found);
        return std::move(*found);
    }
    throw CimStatus(CMPI_RC_ERR_NOT_FOUND, "no instance " + path.text());
}

std::vector<Instance> ObjectManager::associators(const ObjectPath& source,
                                                 const AssociationFilter& filter) const {
    requireClass(source.nameSpace, source.className);
    requireKnown("AssocClass", filter.assocClass);
    requireKnown("ResultClass", filter.resultClass);
    return repository_.associators(source, filter);
}

std::vector<Instance> ObjectManager::references(const ObjectPath& source,
                                                const std::string& resultClass,
                                                const std::string& role) const {
    requireClass(source.nameSpace, source.className);
    requireKnown("ResultClass", resultClass);
    return repository_.references(source, resultClass, role);
}

ObjectPath ObjectManager::withKeyName(ObjectPath path) const {
    const auto nameless = std::find_if(path.keys.begin(), path.keys.end(),
                                       [](const NamedValue& key) { return key.first.empty(); });
    if (nameless == path.keys.end()) return path;
    auto properties = repository_.allProperties(path.nameSpace, path.className);
    std::erase_if(properties, [](const PropertyDefinition& property) { return !property.isKey; });
    if (properties.size() != 1) {
        throw CimStatus(CMPI_RC_ERR_INVALID_PARAMETER,
                        path.className + " has not exactly one key, and the key has no name");
    }
    nameless->first = properties.front().name;
    return path;
}

}  // namespace testbed
