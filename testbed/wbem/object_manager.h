// What a client of the object manager sees: the repository's objects, and those of the provider
// under the classes that it is registered for.
#pragma once

#include <optional>
#include <string>
#include <vector>

#include "cim_object.h"
#include "instance_client.h"
#include "repository.h"

namespace testbed {

/// For which classes requests go to the provider.
struct Registration {
    InstanceClient client;
    std::string nameSpace;
    std::vector<std::string> classes;
};

/// Thread-safe as far as the provider is. What cannot be answered throws CimStatus.
class ObjectManager {
public:
    /// The repository and the provider must outlive the manager.
    /// Defines in root/interop the classes by which clients find namespaces and server. `system`
    /// names this host.
    explicit ObjectManager(Repository& repository, std::optional<Registration> provider = {},
                           std::string system = "localhost");

    const Repository& repository() const { return repository_; }

    void requireNamespace(const std::string& nameSpace) const;
    /// The class is in the namespace, or registered for it. Status 5.
    void requireClass(const std::string& nameSpace, const std::string& className) const;

    /// Whether the class, or one below it, is a provider's.
    bool asksProvider(const std::string& nameSpace, const std::string& className) const {
        return !providerClasses(nameSpace, className).empty();
    }

    /// Of the class and all below it. A provider that fails fails the request.
    std::vector<ObjectPath> instanceNames(const std::string& nameSpace,
                                          const std::string& className) const;
    std::vector<Instance> instances(const std::string& nameSpace, const std::string& className,
                                    const PropertyList& properties) const;
    Instance instance(const ObjectPath& path, const PropertyList& properties) const;

    /// None for the provider's instances.
    std::vector<Instance> associators(const ObjectPath& source,
                                      const AssociationFilter& filter) const;
    std::vector<Instance> references(const ObjectPath& source, const std::string& resultClass,
                                     const std::string& role) const;

    /// Gives a single key that came without a name the name that its class has. Status 4 when the
    /// class has not exactly one key.
    ObjectPath withKeyName(ObjectPath path) const;

private:
    /// All that need no provider: the repository's instances and associations, and the manager's
    /// own.
    std::vector<Instance> staticInstances(const std::string& nameSpace,
                                          const std::string& className) const;
    std::optional<Instance> staticInstance(const ObjectPath& path) const;
    /// Classes that a walk names must be known. Status 4.
    void requireKnown(const char* parameter, const std::optional<std::string>& className) const;
    /// The provider's classes that a request for the class is meant for, each in the spelling in
    /// which the provider is to see it.
    std::vector<std::string> providerClasses(const std::string& nameSpace,
                                             const std::string& className) const;
    bool isProviderClass(const std::string& nameSpace, const std::string& className) const;

    Repository& repository_;
    std::optional<Registration> provider_;
    std::string system_;
};

/// Leaves only those properties that the list has.
void restrictTo(const PropertyList& properties, Instance& instance);

}  // namespace testbed
