// The classes and instances of root/interop.
#include "interop_objects.h"

namespace testbed {
namespace {

constexpr const char* kSystemClass = "CIM_ComputerSystem";
constexpr const char* kManagerClass = "CIM_ObjectManager";
constexpr const char* kNamespaceClass = "CIM_Namespace";
constexpr const char* kOldNamespaceClass = "__Namespace";
constexpr const char* kManagerName = "plexor-testbed";

PropertyDefinition keyOf(const char* className, const char* name) {
    return {name, CMPI_string, true, className, CimValue::null(CMPI_string), {}};
}

PropertyDefinition propertyOf(const char* className, const char* name, CMPIType type) {
    return {name, type, false, className, CimValue::null(type), {}};
}

/// Below the superclass when the namespace has it; a root class otherwise.
void define(Repository& repository, const char* name, const char* superclass,
            std::vector<PropertyDefinition> properties) {
    const bool hasSuperclass = repository.hasClass(kInteropNamespace, superclass);
    if (repository.hasClass(kInteropNamespace, name)) return;
    repository.defineClass(
        kInteropNamespace,
        {name, hasSuperclass ? superclass : "", std::move(properties), {}, false});
}

/// Adds a property that is a key as well.
void setKey(Instance& instance, const char* name, const std::string& value) {
    instance.path.key(name, CimValue::string(value));
    instance.set(name, CimValue::string(value));
}

Instance managerInstance(const std::string& system) {
    Instance manager{{kInteropNamespace, kManagerClass, {}}, {}};
    setKey(manager, "SystemCreationClassName", kSystemClass);
    setKey(manager, "SystemName", system);
    setKey(manager, "CreationClassName", kManagerClass);
    setKey(manager, "Name", kManagerName);
    manager.set("ElementName", CimValue::string(kManagerName));
    manager.set("Description", CimValue::string("A simulated RAID array behind a CIM server"));
    return manager.set("GatherStatisticalData", CimValue::boolean(false));
}

Instance namespaceInstance(const std::string& system, const std::string& name) {
    Instance instance{{kInteropNamespace, kNamespaceClass, {}}, {}};
    setKey(instance, "SystemCreationClassName", kSystemClass);
    setKey(instance, "SystemName", system);
    setKey(instance, "ObjectManagerCreationClassName", kManagerClass);
    setKey(instance, "ObjectManagerName", kManagerName);
    setKey(instance, "CreationClassName", kNamespaceClass);
    setKey(instance, "Name", name);
    constexpr std::uint16_t kUnknown = 0;
    return instance.set("ClassInfo", CimValue::uint16(kUnknown));
}

Instance oldNamespaceInstance(const std::string& name) {
    Instance instance{{kInteropNamespace, kOldNamespaceClass, {}}, {}};
    setKey(instance, "Name", name);
    return instance;
}

}  // namespace

void defineInteropClasses(Repository& repository) {
    const char* service = "CIM_Service";
    define(repository, service, "CIM_EnabledLogicalElement",
           {keyOf(service, "SystemCreationClassName"), keyOf(service, "SystemName"),
            keyOf(service, "CreationClassName"), keyOf(service, "Name")});
    define(repository, "CIM_WBEMService", service, {});
    define(repository, kManagerClass, "CIM_WBEMService",
           {propertyOf(kManagerClass, "GatherStatisticalData", CMPI_boolean)});
    define(
        repository, kNamespaceClass, "CIM_ManagedElement",
        {keyOf(kNamespaceClass, "SystemCreationClassName"), keyOf(kNamespaceClass, "SystemName"),
         keyOf(kNamespaceClass, "ObjectManagerCreationClassName"),
         keyOf(kNamespaceClass, "ObjectManagerName"), keyOf(kNamespaceClass, "CreationClassName"),
         keyOf(kNamespaceClass, "Name"), propertyOf(kNamespaceClass, "ClassInfo", CMPI_uint16)});
    define(repository, kOldNamespaceClass, "", {keyOf(kOldNamespaceClass, "Name")});
}

std::vector<Instance> interopInstances(const Repository& repository, const std::string& nameSpace,
                                       const std::string& className, const std::string& system) {
    if (!sameName(nameSpace, kInteropNamespace)) return {};
    std::vector<Instance> found;
    const auto add = [&](Instance instance) {
        if (repository.isA(nameSpace, instance.path.className, className)) {
            found.push_back(std::move(instance));
        }
    };
    add(managerInstance(system));
    for (const std::string& name : repository.namespaceNames()) {
        add(namespaceInstance(system, name));
        add(oldNamespaceInstance(name));
    }
    return found;
}

}  // namespace testbed
