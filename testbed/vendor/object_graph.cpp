// Placing graphs in the repository, and withdrawing them.
#include "object_graph.h"

#include "class_catalogue.h"

namespace testbed {
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
    for (const GraphObject& object : objects_) placeObject(repository, object);
}

void ObjectGraph::place(Repository& repository) const {
    renew(repository);
    for (const GraphLink& link : links_) placeLink(repository, link);
}

/// With its class, which the vendor may have made up.
void ObjectGraph::placeObject(Repository& repository, const GraphObject& object) {
    const ObjectPath& path = object.instance.path;
    defineClassBelow(repository, path.nameSpace, path.className, object.cimClass);
    repository.put(object.instance);
}

void ObjectGraph::placeLink(Repository& repository, const GraphLink& link) const {
    const AssociationRoles& roles = rolesOf(link.cimAssociation);
    repository.associate(vendorAssociation(link), {roles.leftRole, link.left},
                         {roles.rightRole, link.right});
}

void ObjectGraph::withdrawLink(Repository& repository, const GraphLink& link) const {
    repository.dissociate(vendorAssociation(link), link.left, link.right);
}

void ObjectGraph::withdraw(Repository& repository) const {
    for (const GraphLink& link : links_) withdrawLink(repository, link);
    for (const GraphObject& object : objects_) repository.remove(object.instance.path);
}

}  // namespace testbed
