// The entries that ask: get, enumerate, and the four walks along associations.
#include <algorithm>

#include "broker_calls.h"
#include "broker_tables.h"
#include "conversions.h"
#include "object_enumeration.h"
#include "object_instance.h"
#include "object_string.h"

namespace testbed {

namespace {

using Names = std::optional<std::vector<std::string>>;

std::optional<std::string> optionalText(const char* text) {
    return text ? std::optional<std::string>(text) : std::nullopt;
}

bool contains(const std::vector<std::string>& names, const std::string& name) {
    return std::any_of(names.begin(), names.end(),
                       [&](const std::string& listed) { return sameName(listed, name); });
}

/// The instance as this broker shows it: with the wanted properties and, when its class is said to
/// have a live provider, with all that the class knows.
Instance shown(const BrokerCore& core, Instance instance, const Names& wanted) {
    if (core.options.allProperties) {
        const ObjectPath& path = instance.path;
        for (const auto& property : core.repository.allProperties(path.nameSpace, path.className)) {
            if (instance.find(property.name) != nullptr) continue;
            instance.set(property.name, CimValue::null(property.type));
        }
    }
    if (wanted) {
        std::erase_if(instance.properties, [&](const NamedValue& property) {
            return !contains(*wanted, property.first);
        });
    }
    return instance;
}

/// Whether the manager's own repository would have to answer for that path, and finds nothing.
bool isLostOn(const BrokerCore& core, const ObjectPath& path) {
    return !path.host.empty() && contains(core.options.staticNamespaces, path.nameSpace);
}

CMPIEnumeration* enumerationOf(BrokerCore& core, std::vector<Instance> found, bool onlyNames,
                               const Names& wanted) {
    if (core.options.randomOrder) core.order.shuffle(found);
    for (Instance& instance : found) instance.path.host = core.options.hostInPaths;
    auto& result = makeInArena<EnumerationObject>(core, onlyNames ? CMPI_ref : CMPI_instance);
    if (onlyNames) {
        std::vector<ObjectPath> paths;
        for (Instance& instance : found) paths.push_back(std::move(instance.path));
        result.fill(std::move(paths));
        return &result;
    }
    for (Instance& instance : found) instance = shown(core, std::move(instance), wanted);
    result.fill(std::move(found));
    return &result;
}

CMPIEnumeration* enumerate(const CMPIBroker* broker, const CMPIContext* ctx,
                           const CMPIObjectPath* classPath, Entry entry, const char** properties,
                           CMPIStatus* status) {
    const auto path = readPath(classPath, entry);
    CallRecord record = describeCall(entry, path);
    record.hasPropertyList = properties != nullptr;
    return answerUpCall<CMPIEnumeration*>(
        broker, ctx, std::move(record), status,
        [&](BrokerCore& core, CMPIStatus& outcome) -> CMPIEnumeration* {
            if (!path) {
                outcome.rc = CMPI_RC_ERR_INVALID_PARAMETER;
            } else if (!core.repository.hasNamespace(path->nameSpace)) {
                outcome.rc = CMPI_RC_ERR_INVALID_NAMESPACE;
            } else if (!core.repository.hasClass(path->nameSpace, path->className)) {
                outcome.rc = CMPI_RC_ERR_INVALID_CLASS;
            }
            if (outcome.rc != CMPI_RC_OK) return nullptr;
            return enumerationOf(core, core.repository.enumerate(path->nameSpace, path->className),
                                 entry == Entry::EnumerateInstanceNames, readNames(properties));
        });
}

CMPIEnumeration* enumerateInstanceNames(const CMPIBroker* broker, const CMPIContext* ctx,
                                        const CMPIObjectPath* classPath, CMPIStatus* status) {
    return enumerate(broker, ctx, classPath, Entry::EnumerateInstanceNames, nullptr, status);
}

CMPIEnumeration* enumerateInstances(const CMPIBroker* broker, const CMPIContext* ctx,
                                    const CMPIObjectPath* classPath, const char** properties,
                                    CMPIStatus* status) {
    return enumerate(broker, ctx, classPath, Entry::EnumerateInstances, properties, status);
}

CMPIInstance* getInstance(const CMPIBroker* broker, const CMPIContext* ctx,
                          const CMPIObjectPath* instancePath, const char** properties,
                          CMPIStatus* status) {
    const auto path = readPath(instancePath, Entry::GetInstance);
    CallRecord record = describeCall(Entry::GetInstance, path);
    record.hasPropertyList = properties != nullptr;
    return answerUpCall<CMPIInstance*>(
        broker, ctx, std::move(record), status,
        [&](BrokerCore& core, CMPIStatus& outcome) -> CMPIInstance* {
            if (!path) {
                outcome.rc = CMPI_RC_ERR_INVALID_PARAMETER;
                return nullptr;
            }
            if (!core.repository.hasNamespace(path->nameSpace)) {
                outcome.rc = CMPI_RC_ERR_INVALID_NAMESPACE;
                return nullptr;
            }
            auto found = isLostOn(core, *path) ? std::nullopt : core.repository.get(*path);
            if (!found) {
                outcome = {CMPI_RC_ERR_NOT_FOUND, &makeInArena<StringObject>(core, "")};
                return nullptr;
            }
            found->path.host = core.options.hostInPaths;
            return &makeInArena<InstanceObject>(
                core, shown(core, std::move(*found), readNames(properties)));
        });
}

/// Why a walk fails, or OK.
CMPIrc refusalOf(const BrokerCore& core, const std::optional<ObjectPath>& source,
                 const AssociationFilter& filter, bool toReferences) {
    if (!source) return CMPI_RC_ERR_INVALID_PARAMETER;
    const Repository& repository = core.repository;
    if (!repository.hasNamespace(source->nameSpace)) return CMPI_RC_ERR_FAILED;
    if (core.options.unknownClassFails) {
        for (const auto& name :
             {std::optional(source->className), filter.assocClass, filter.resultClass}) {
            if (name && !repository.hasClass(source->nameSpace, *name)) {
                return CMPI_RC_ERR_INVALID_CLASS;
            }
        }
    }
    if (core.options.danglingFails && !toReferences && repository.hasDangling(*source, filter)) {
        return CMPI_RC_ERR_NOT_FOUND;
    }
    return CMPI_RC_OK;
}

/// All four ways along associations; they differ in what they walk to and whether names suffice.
CMPIEnumeration* walk(const CMPIBroker* broker, const CMPIContext* ctx,
                      const CMPIObjectPath* sourcePath, Entry entry,
                      const AssociationFilter& filter, const char** properties,
                      CMPIStatus* status) {
    const bool toReferences = entry == Entry::References || entry == Entry::ReferenceNames;
    const bool onlyNames = entry == Entry::AssociatorNames || entry == Entry::ReferenceNames;
    const auto path = readPath(sourcePath, entry);
    CallRecord record = describeCall(entry, path);
    record.assocClass = filter.assocClass;
    record.resultClass = filter.resultClass;
    record.role = filter.role;
    record.resultRole = filter.resultRole;
    record.hasPropertyList = properties != nullptr;
    return answerUpCall<CMPIEnumeration*>(
        broker, ctx, std::move(record), status,
        [&](BrokerCore& core, CMPIStatus& outcome) -> CMPIEnumeration* {
            outcome.rc = refusalOf(core, path, filter, toReferences);
            if (outcome.rc != CMPI_RC_OK) return nullptr;
            std::vector<Instance> found;
            if (!isLostOn(core, *path)) {
                found = toReferences
                            ? core.repository.references(*path, filter.resultClass.value_or(""),
                                                         filter.role.value_or(""))
                            : core.repository.associators(*path, filter);
            }
            return enumerationOf(core, std::move(found), onlyNames, readNames(properties));
        });
}

AssociationFilter filterOf(const char* assocClass, const char* resultClass, const char* role,
                           const char* resultRole) {
    return {optionalText(assocClass), optionalText(resultClass), optionalText(role),
            optionalText(resultRole)};
}

CMPIEnumeration* associators(const CMPIBroker* broker, const CMPIContext* ctx,
                             const CMPIObjectPath* path, const char* assocClass,
                             const char* resultClass, const char* role, const char* resultRole,
                             const char** properties, CMPIStatus* status) {
    return walk(broker, ctx, path, Entry::Associators,
                filterOf(assocClass, resultClass, role, resultRole), properties, status);
}

CMPIEnumeration* associatorNames(const CMPIBroker* broker, const CMPIContext* ctx,
                                 const CMPIObjectPath* path, const char* assocClass,
                                 const char* resultClass, const char* role, const char* resultRole,
                                 CMPIStatus* status) {
    return walk(broker, ctx, path, Entry::AssociatorNames,
                filterOf(assocClass, resultClass, role, resultRole), nullptr, status);
}

CMPIEnumeration* references(const CMPIBroker* broker, const CMPIContext* ctx,
                            const CMPIObjectPath* path, const char* resultClass, const char* role,
                            const char** properties, CMPIStatus* status) {
    return walk(broker, ctx, path, Entry::References, filterOf(nullptr, resultClass, role, nullptr),
                properties, status);
}

CMPIEnumeration* referenceNames(const CMPIBroker* broker, const CMPIContext* ctx,
                                const CMPIObjectPath* path, const char* resultClass,
                                const char* role, CMPIStatus* status) {
    return walk(broker, ctx, path, Entry::ReferenceNames,
                filterOf(nullptr, resultClass, role, nullptr), nullptr, status);
}

}  // namespace

void fillQueryEntries(CMPIBrokerFT& table) {
    table.enumerateInstanceNames = enumerateInstanceNames;
    table.enumerateInstances = enumerateInstances;
    table.getInstance = getInstance;
    table.associators = associators;
    table.associatorNames = associatorNames;
    table.references = references;
    table.referenceNames = referenceNames;
}

}  // namespace testbed
