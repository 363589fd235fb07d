// Associations between instances, walking them, and the order of results.
#include <algorithm>
#include <mutex>
#include <set>

#include "repository.h"

namespace testbed {

namespace {

bool roleMatches(const std::optional<std::string>& wanted, const std::string& role) {
    return !wanted || sameName(*wanted, role);
}

}  // namespace

void Repository::associate(std::string_view assocClass, AssociationEnd left, AssociationEnd right) {
    Association association{std::string(assocClass), std::move(left), std::move(right), {}, {}};
    association.leftIdentity = association.left.object.identity();
    association.rightIdentity = association.right.object.identity();
    const std::unique_lock lock(mutex_);
    const std::size_t number = nextAssociation_++;
    ends_[association.leftIdentity].push_back(number);
    if (association.rightIdentity != association.leftIdentity) {
        ends_[association.rightIdentity].push_back(number);
    }
    associations_.emplace(number, std::move(association));
}

std::size_t Repository::dissociate(std::string_view assocClass, const ObjectPath& left,
                                   const ObjectPath& right) {
    const std::string first = left.identity();
    const std::string second = right.identity();
    const std::unique_lock lock(mutex_);
    const auto joins = [&](const Association& association) {
        const bool areEnds =
            (association.leftIdentity == first && association.rightIdentity == second) ||
            (association.leftIdentity == second && association.rightIdentity == first);
        return areEnds && (sameName(association.assocClass, assocClass) ||
                           associationIsA(association, std::string(assocClass)));
    };
    const std::vector<std::size_t> candidates = ends_[first];
    std::size_t removed = 0;
    for (const std::size_t number : candidates) {
        if (!joins(associations_.at(number))) continue;
        std::erase(ends_[first], number);
        std::erase(ends_[second], number);
        associations_.erase(number);
        removed++;
    }
    return removed;
}

bool Repository::associationIsA(const Association& association, const std::string& ancestor) const {
    // The ends may lie in two namespaces; either may be the association's.
    return isALocked(association.left.object.nameSpace, association.assocClass, ancestor) ||
           isALocked(association.right.object.nameSpace, association.assocClass, ancestor);
}

bool Repository::matchesEnd(const Association& association, const AssociationEnd& near,
                            const AssociationEnd& far, const AssociationFilter& filter) const {
    if (!roleMatches(filter.role, near.role)) return false;
    if (!roleMatches(filter.resultRole, far.role)) return false;
    if (filter.assocClass && !associationIsA(association, *filter.assocClass)) return false;
    return !filter.resultClass ||
           isALocked(far.object.nameSpace, far.object.className, *filter.resultClass);
}

template <class Visit>
void Repository::walkLocked(const ObjectPath& source, const AssociationFilter& filter,
                            Visit visit) const {
    if (classLocked(source.nameSpace, source.className) == nullptr) return;
    const std::string origin = source.identity();
    const auto tryEnd = [&](const Association& association, const AssociationEnd& near,
                            const AssociationEnd& far, const std::string& farIdentity) {
        if (!matchesEnd(association, near, far, filter)) return;
        visit(association, farIdentity, instanceLocked(farIdentity));
    };
    const auto numbers = ends_.find(origin);
    if (numbers == ends_.end()) return;
    for (const std::size_t number : numbers->second) {
        const Association& association = associations_.at(number);
        if (association.leftIdentity == origin) {
            tryEnd(association, association.left, association.right, association.rightIdentity);
        }
        if (association.rightIdentity == origin) {
            tryEnd(association, association.right, association.left, association.leftIdentity);
        }
    }
}

std::vector<Instance> Repository::associators(const ObjectPath& source,
                                              const AssociationFilter& filter) const {
    std::vector<Instance> found;
    std::set<std::string> seen;
    {
        const std::shared_lock lock(mutex_);
        walkLocked(source, filter,
                   [&](const Association&, const std::string& identity, const Instance* instance) {
                       if (instance == nullptr) return;
                       if (seen.insert(identity).second) found.push_back(*instance);
                   });
    }
    shuffle(found);
    return found;
}

bool Repository::hasDangling(const ObjectPath& source, const AssociationFilter& filter) const {
    const std::shared_lock lock(mutex_);
    bool dangling = false;
    walkLocked(source, filter, [&](const Association&, const std::string&, const Instance* far) {
        if (far == nullptr) dangling = true;
    });
    return dangling;
}

std::vector<Instance> Repository::references(const ObjectPath& source, std::string_view resultClass,
                                             std::string_view role) const {
    AssociationFilter filter;
    if (!resultClass.empty()) filter.assocClass = resultClass;
    if (!role.empty()) filter.role = role;

    std::vector<Instance> found;
    std::set<const Association*> seen;
    {
        const std::shared_lock lock(mutex_);
        walkLocked(source, filter,
                   [&](const Association& association, const std::string&, const Instance* far) {
                       if (far == nullptr) return;
                       if (!seen.insert(&association).second) return;
                       found.push_back(instanceOf(association, source.nameSpace));
                   });
    }
    shuffle(found);
    return found;
}

Instance Repository::instanceOf(const Association& association, std::string_view nameSpace) {
    Instance instance;
    instance.path = {std::string(nameSpace), association.assocClass, {}};
    for (const AssociationEnd* end : {&association.left, &association.right}) {
        instance.path.key(end->role, CimValue::reference(end->object));
        instance.set(end->role, CimValue::reference(end->object));
    }
    return instance;
}

std::vector<Instance> Repository::associationInstances(std::string_view nameSpace,
                                                       std::string_view className) const {
    const std::shared_lock lock(mutex_);
    std::vector<Instance> found;
    for (const auto& [number, association] : associations_) {
        const bool isHere = sameName(association.left.object.nameSpace, nameSpace) ||
                            sameName(association.right.object.nameSpace, nameSpace);
        if (!isHere || !isALocked(nameSpace, association.assocClass, className)) continue;
        if (instanceLocked(association.leftIdentity) == nullptr) continue;
        if (instanceLocked(association.rightIdentity) == nullptr) continue;
        found.push_back(instanceOf(association, nameSpace));
    }
    return found;
}

void Repository::shuffleResults(std::uint32_t seed) {
    const std::unique_lock lock(mutex_);
    shuffle_.emplace(seed);
}

void Repository::shuffle(std::vector<Instance>& instances) const {
    const std::unique_lock lock(mutex_);
    if (shuffle_) std::shuffle(instances.begin(), instances.end(), *shuffle_);
}

}  // namespace testbed
