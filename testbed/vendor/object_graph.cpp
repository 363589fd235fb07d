// Placing graphs in the repository, exchanging old ones for new ones, and withdrawing them.
#include "object_graph.h"

#include <map>
#include <set>

#include "class_catalogue.h"

namespace testbed {
namespace {

/// An instance with its class, which the vendor may have made up.
void put(Repository& repository, const GraphObject& object) {
    const ObjectPath& path = object.instance.path;
    defineClassBelow(repository, path.nameSpace, path.className, object.cimClass);
    repository.put(object.instance);
}

}  // namespace

void ObjectGraph::add(const std::string& cimClass, const ObjectPath& path,
                      std::vector<NamedValue> properties, const Tweaks& tweaks) {
    Instance instance;
    instance.path = path;
    for (const auto& [name, value] : path.keys) instance.set(name, value);
    for (auto& [name, value] : properties) instance.set(name, std::move(value));
    for (const auto& [name, value] : tweaks.properties) instance.set(name, value);
    for (const std::string& name : tweaks.omit) instance.erase(name);
    objects_.push_back({std::move(instance), cimClass});
}

void ObjectGraph::link(const std::string& cimAssociation, const ObjectPath& left,
                       const ObjectPath& right) {
    links_.push_back({cimAssociation, left, right});
}

std::string ObjectGraph::vendorAssociation(const GraphLink& link) const {
    return naming_.vendorClass(link.cimAssociation.substr(std::string("CIM_").size()));
}

void ObjectGraph::renew(Repository& repository) const {
    for (const GraphObject& object : objects_) put(repository, object);
}

void ObjectGraph::place(Repository& repository) const {
    renew(repository);
    for (const GraphLink& link : links_) placeLink(repository, link);
}

void ObjectGraph::placeLink(Repository& repository, const GraphLink& link) const {
    const AssociationRoles& roles = rolesOf(link.cimAssociation);
    repository.associate(vendorAssociation(link), {roles.leftRole, link.left},
                         {roles.rightRole, link.right});
}

void ObjectGraph::withdraw(Repository& repository) const {
    for (const GraphLink& link : links_) {
        repository.dissociate(vendorAssociation(link), link.left, link.right);
    }
    for (const GraphObject& object : objects_) repository.remove(object.instance.path);
}

namespace {

std::string identityOf(const GraphLink& link) {
    return link.cimAssociation + "\n" + link.left.identity() + "\n" + link.right.identity();
}

}  // namespace

void ObjectGraph::exchange(Repository& repository, const std::vector<ObjectGraph>& before,
                           const std::vector<ObjectGraph>& after) {
    std::map<std::string, const Instance*> oldObjects;
    std::set<std::string> oldLinks, newObjects, newLinks;
    for (const ObjectGraph& graph : before) {
        for (const GraphObject& object : graph.objects_) {
            oldObjects[object.instance.path.identity()] = &object.instance;
        }
        for (const GraphLink& link : graph.links_) oldLinks.insert(identityOf(link));
    }
    for (const ObjectGraph& graph : after) {
        for (const GraphObject& object : graph.objects_) {
            const std::string identity = object.instance.path.identity();
            newObjects.insert(identity);
            const auto old = oldObjects.find(identity);
            if (old != oldObjects.end() && *old->second == object.instance) continue;
            put(repository, object);
        }
    }
    // Links after all objects: an object that is listed exists.
    for (const ObjectGraph& graph : after) {
        for (const GraphLink& link : graph.links_) {
            if (newLinks.insert(identityOf(link)).second && !oldLinks.contains(identityOf(link))) {
                graph.placeLink(repository, link);
            }
        }
    }
    for (const ObjectGraph& graph : before) {
        for (const GraphLink& link : graph.links_) {
            if (!newLinks.contains(identityOf(link))) {
                repository.dissociate(graph.vendorAssociation(link), link.left, link.right);
            }
        }
        for (const GraphObject& object : graph.objects_) {
            if (!newObjects.contains(object.instance.path.identity())) {
                repository.remove(object.instance.path);
            }
        }
    }
}

}  // namespace testbed
