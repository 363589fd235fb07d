// The in-memory CIM repository: namespaces, a class hierarchy, instances and associations.
//
// Every function takes the repository's own lock; results are copies, so they stay what they were
// while the array behind them changes. Order of results is the order of insertion unless
// `shuffleResults` asks for an arbitrary one.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <random>
#include <shared_mutex>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

#include "cim_object.h"

namespace testbed {

/// What a schema says about a class or a property, in the schema's order.
using Qualifiers = std::vector<NamedValue>;

struct PropertyDefinition {
    std::string name;
    CMPIType type = CMPI_null;
    bool isKey = false;
    std::string originClass;          ///< class that introduced the property
    CimValue defaultValue;            ///< null when there is none
    Qualifiers qualifiers = {};       ///< without Key, which isKey tells
    std::string referenceClass = {};  ///< of a reference, as far as it is known
};

struct ParameterDefinition {
    std::string name;
    CMPIType type = CMPI_null;
    std::string referenceClass;  ///< of a reference
    Qualifiers qualifiers = {};
};

/// What a path of a class has to name its object with.
struct KeyDefinition {
    std::string name;
    CMPIType type = CMPI_null;
};

/// A method is described to clients; none can be called.
struct MethodDefinition {
    std::string name;
    CMPIType type = CMPI_null;  ///< of what it returns
    std::string originClass;    ///< class that introduced the method
    std::vector<ParameterDefinition> parameters = {};
    Qualifiers qualifiers = {};
};

struct ClassDefinition {
    std::string name;
    std::string superclass;                      ///< empty for a root class
    std::vector<PropertyDefinition> properties;  ///< own properties only, not inherited ones
    Qualifiers qualifiers = {};
    bool isAssociation = false;
    std::vector<MethodDefinition> methods = {};  ///< own ones only
};

/// One end of an association instance.
struct AssociationEnd {
    std::string role;
    ObjectPath object;
};

/// What an association walk asks for; an absent filter means "any".
struct AssociationFilter {
    std::optional<std::string> assocClass;
    std::optional<std::string> resultClass;
    std::optional<std::string> role;
    std::optional<std::string> resultRole;
};

class Repository {
public:
    Repository() = default;
    Repository(const Repository&) = delete;
    Repository& operator=(const Repository&) = delete;

    void addNamespace(std::string_view nameSpace);
    bool hasNamespace(std::string_view nameSpace) const;
    std::vector<std::string> namespaceNames() const;

    /// Adds or replaces a class; its namespace is created when it is new.
    void defineClass(std::string_view nameSpace, ClassDefinition definition);
    bool hasClass(std::string_view nameSpace, std::string_view className) const;
    std::optional<ClassDefinition> findClass(std::string_view nameSpace,
                                             std::string_view className) const;
    /// Own and inherited properties, the root class's first.
    std::vector<PropertyDefinition> allProperties(std::string_view nameSpace,
                                                  std::string_view className) const;
    /// The keys among them, as cheaply as an answer of a thousand paths needs them.
    std::vector<KeyDefinition> keys(std::string_view nameSpace, std::string_view className) const;
    /// One property of the class, own or inherited.
    std::optional<PropertyDefinition> findProperty(std::string_view nameSpace,
                                                   std::string_view className,
                                                   std::string_view name) const;
    /// Own and inherited methods, the root class's first.
    std::vector<MethodDefinition> allMethods(std::string_view nameSpace,
                                             std::string_view className) const;
    /// True when any namespace has the class.
    bool knowsClass(std::string_view className) const;
    std::vector<std::string> classNames(std::string_view nameSpace) const;
    /// True for the class itself and for every class below `ancestor`; false for anything unknown.
    bool isA(std::string_view nameSpace, std::string_view className,
             std::string_view ancestor) const;

    /// Adds the instance, or replaces the one with an equal path in its place.
    void put(Instance instance);
    /// Removes the instance; associations to it dangle and are left out of walks. False if absent.
    bool remove(const ObjectPath& path);
    std::optional<Instance> get(const ObjectPath& path) const;
    /// Changes one property of an instance in place. False if the instance is absent.
    bool setProperty(const ObjectPath& path, std::string_view name, CimValue value);
    bool eraseProperty(const ObjectPath& path, std::string_view name);
    /// Instances of the class and of all classes below it.
    std::vector<Instance> enumerate(std::string_view nameSpace, std::string_view className) const;

    /// Adds an association instance between two objects (which need not exist yet).
    void associate(std::string_view assocClass, AssociationEnd left, AssociationEnd right);
    /// Removes every association of that class (or below it) that has both objects. Number removed.
    std::size_t dissociate(std::string_view assocClass, const ObjectPath& left,
                           const ObjectPath& right);
    std::vector<Instance> associators(const ObjectPath& source,
                                      const AssociationFilter& filter) const;
    /// Whether such a walk meets an object that does not exist.
    bool hasDangling(const ObjectPath& source, const AssociationFilter& filter) const;
    /// Association instances that the source takes part in; references as CMPI_ref properties.
    std::vector<Instance> references(const ObjectPath& source, std::string_view resultClass,
                                     std::string_view role) const;

    /// The instances of an association class, and of those below it, that have an end in the
    /// namespace and both ends there.
    std::vector<Instance> associationInstances(std::string_view nameSpace,
                                               std::string_view className) const;

    /// From now on association walks come in an order drawn from `seed`, another one each time.
    void shuffleResults(std::uint32_t seed);

    /// Removes all instances and associations, keeps classes and namespaces.
    void clearInstances();

private:
    struct Space {
        std::string name;
        std::unordered_map<std::string, ClassDefinition, NameHash, NameEqual> classes;
        std::vector<std::string> classOrder;
    };
    struct Association {
        std::string assocClass;
        AssociationEnd left, right;
        std::string leftIdentity, rightIdentity;  // kept, as every walk compares them
    };

    // The caller of these holds mutex_, shared or exclusive; pointers are good while it does.
    const Space* space(std::string_view nameSpace) const;
    /// NULL when there is none.
    static const ClassDefinition* classIn(const Space& home, std::string_view className);
    const ClassDefinition* classLocked(std::string_view nameSpace,
                                       std::string_view className) const;
    /// The class and its ancestors, itself first; empty for an unknown class.
    std::vector<const ClassDefinition*> lineageLocked(std::string_view nameSpace,
                                                      std::string_view className) const;
    /// Own and inherited properties, the root class's first.
    std::vector<const PropertyDefinition*> propertiesLocked(std::string_view nameSpace,
                                                            std::string_view className) const;
    bool isALocked(std::string_view nameSpace, std::string_view className,
                   std::string_view ancestor) const;
    const Instance* instanceLocked(const std::string& identity) const;
    bool associationIsA(const Association& association, const std::string& ancestor) const;
    /// Calls visit(association, identity of the far object, far instance) for each hit; the
    /// instance is NULL for a dangling reference.
    template <class Visit>
    void walkLocked(const ObjectPath& source, const AssociationFilter& filter, Visit visit) const;
    static Instance instanceOf(const Association& association, std::string_view nameSpace);
    bool matchesEnd(const Association& association, const AssociationEnd& near,
                    const AssociationEnd& far, const AssociationFilter& filter) const;

    /// Reorders a walk's result when asked to. Takes mutex_.
    void shuffle(std::vector<Instance>& instances) const;

    mutable std::shared_mutex mutex_;
    std::vector<Space> spaces_;                        // by folded name; guarded by mutex_
    std::vector<Instance> instances_;                  // guarded by mutex_
    std::map<std::string, std::size_t> index_;         // identity -> position; guarded by mutex_
    std::map<std::size_t, Association> associations_;  // by number; guarded by mutex_
    std::size_t nextAssociation_ = 0;                  // guarded by mutex_
    /// Identity of an object -> numbers of the associations that it takes part in, in order;
    /// guarded by mutex_.
    std::unordered_map<std::string, std::vector<std::size_t>> ends_;
    mutable std::optional<std::mt19937> shuffle_;  // guarded by mutex_ (exclusive)
};

}  // namespace testbed
