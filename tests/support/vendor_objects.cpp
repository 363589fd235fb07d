#include "vendor_objects.h"

#include <vector>

namespace plexortest {

using testbed::CimValue;

namespace {

struct ClassPair {
    const char* name;
    const char* superclass;
};

constexpr ClassPair kCimClasses[] = {
    {"CIM_ManagedElement", ""},
    {"CIM_RegisteredProfile", "CIM_ManagedElement"},
    {"CIM_ComputerSystem", "CIM_ManagedElement"},
    {"CIM_LogicalDevice", "CIM_ManagedElement"},
    {"CIM_PortController", "CIM_LogicalDevice"},
    {"CIM_DiskDrive", "CIM_LogicalDevice"},
    {"CIM_SASSATAPort", "CIM_LogicalDevice"},
    {"CIM_Battery", "CIM_LogicalDevice"},
    {"CIM_Fan", "CIM_LogicalDevice"},
    {"CIM_StorageExtent", "CIM_LogicalDevice"},
    {"CIM_StorageVolume", "CIM_StorageExtent"},
    {"CIM_PhysicalPackage", "CIM_ManagedElement"},
    {"CIM_Chassis", "CIM_PhysicalPackage"},
    {"CIM_Slot", "CIM_ManagedElement"},
    {"CIM_SoftwareIdentity", "CIM_ManagedElement"},
    {"CIM_StoragePool", "CIM_ManagedElement"},
    {"CIM_StorageSetting", "CIM_ManagedElement"},
};

constexpr const char* kAssociations[] = {
    "CIM_ElementConformsToProfile",
    "CIM_LogicalIdentity",
    "CIM_Realizes",
    "CIM_ElementSoftwareIdentity",
    "CIM_HostedStoragePool",
    "CIM_SystemPackaging",
    "CIM_SystemDevice",
    "CIM_MediaPresent",
    "CIM_ConcreteComponent",
    "CIM_PackageInConnector",
    "CIM_Container",
    "CIM_ElementSettingData",
    "CIM_AllocatedFromStoragePool",
};

void define(testbed::Repository& repository, const char* nameSpace, const std::string& name,
            const std::string& superclass) {
    repository.defineClass(nameSpace, {name, superclass, {}});
}

std::string vendorName(const std::string& cimName) { return "Sample_" + cimName.substr(4); }

}  // namespace

VendorObjects::VendorObjects(testbed::Repository& repository) : repository_(repository) {
    for (const char* nameSpace : {"root/cimv2", "root/interop", "root/sample"}) {
        for (const ClassPair& cim : kCimClasses) {
            define(repository, nameSpace, cim.name, cim.superclass);
            define(repository, nameSpace, vendorName(cim.name), cim.name);
        }
        for (const char* association : kAssociations) {
            define(repository, nameSpace, association, "");
            define(repository, nameSpace, vendorName(association), association);
        }
    }
    define(repository, "root/cimv2", "OMC_UnitaryComputerSystem", "CIM_ComputerSystem");
}

VendorObjects::Path VendorObjects::object(const std::string& cimSuffix, const std::string& keyName,
                                          const std::string& key, Properties properties,
                                          const std::string& nameSpace) {
    testbed::Instance instance;
    instance.path.nameSpace = nameSpace;
    instance.path.className = "Sample_" + cimSuffix;
    instance.path.key(keyName, CimValue::string(key));
    instance.set(keyName, CimValue::string(key));
    for (const auto& [name, value] : properties) instance.set(name, value);
    repository_.put(instance);
    return instance.path;
}

void VendorObjects::link(const std::string& assocClass, const Path& left, const Path& right) {
    repository_.associate(vendorName(assocClass), {"Antecedent", left}, {"Dependent", right});
}

void VendorObjects::set(const Path& path, const std::string& name, CimValue value) {
    repository_.setProperty(path, name, std::move(value));
}

VendorObjects::Path VendorObjects::host(const std::string& name, const std::string& elementName,
                                        const std::string& creationClass) {
    testbed::Instance instance;
    instance.path.nameSpace = "root/cimv2";
    instance.path.className = "OMC_UnitaryComputerSystem";
    instance.path.key("CreationClassName", CimValue::string(creationClass));
    instance.path.key("Name", CimValue::string(name));
    instance.set("Name", CimValue::string(name));
    instance.set("ElementName", CimValue::string(elementName));
    instance.set("CreationClassName", CimValue::string(creationClass));
    repository_.put(instance);
    return instance.path;
}

VendorObjects::Path VendorObjects::profile(const std::string& id,
                                           const std::string& registeredName) {
    return object("RegisteredProfile", "InstanceID", id,
                  {{"RegisteredName", CimValue::string(registeredName)},
                   {"RegisteredOrganization", CimValue::uint16(2)},
                   {"RegisteredVersion", CimValue::string("1.0.0")}},
                  "root/interop");
}

VendorObjects::Path VendorObjects::portController(const Path& profile,
                                                  const std::string& deviceId) {
    const Path path = object("PortController", "DeviceID", deviceId);
    link("CIM_ElementConformsToProfile", profile, path);
    return path;
}

VendorObjects::Path VendorObjects::system(const Path& portController, const std::string& name) {
    const Path path = object("ComputerSystem", "Name", name,
                             {{"OperationalStatus", CimValue::uint16Array({2})}});
    link("CIM_LogicalIdentity", portController, path);
    return path;
}

VendorObjects::Path VendorObjects::card(const Path& portController, const std::string& model,
                                        std::uint16_t health) {
    const Path path =
        object("PhysicalPackage", "Tag", "card-" + model,
               {{"Model", CimValue::string(model)}, {"HealthState", CimValue::uint16(health)}});
    link("CIM_Realizes", path, portController);
    return path;
}

VendorObjects::Path VendorObjects::software(const Path& owner, const std::string& id,
                                            std::uint16_t classification,
                                            const std::string& version) {
    const Path path = object("SoftwareIdentity", "InstanceID", id,
                             {{"Classifications", CimValue::uint16Array({classification})},
                              {"VersionString", CimValue::string(version)}});
    link("CIM_ElementSoftwareIdentity", path, owner);
    return path;
}

VendorObjects::Path VendorObjects::pool(const Path& system, const std::string& instanceId,
                                        bool primordial) {
    const Path path = object("StoragePool", "InstanceID", instanceId,
                             {{"PoolID", CimValue::string("id-" + instanceId)},
                              {"TotalManagedSpace", CimValue::uint64(1000)},
                              {"RemainingManagedSpace", CimValue::uint64(400)},
                              {"Primordial", CimValue::boolean(primordial)},
                              {"OperationalStatus", CimValue::uint16Array({2})}});
    link("CIM_HostedStoragePool", system, path);
    return path;
}

VendorObjects::Path VendorObjects::chassis(const Path& system, const std::string& tag) {
    const Path path =
        object("Chassis", "Tag", tag, {{"OperationalStatus", CimValue::uint16Array({2})}});
    link("CIM_SystemPackaging", path, system);
    return path;
}

VendorObjects::Path VendorObjects::drive(const Path& system, const std::string& deviceId) {
    const Path path = object("DiskDrive", "DeviceID", deviceId,
                             {{"Name", CimValue::string("Drive " + deviceId)},
                              {"EnabledState", CimValue::uint16(2)},
                              {"OperationalStatus", CimValue::uint16Array({2})}});
    link("CIM_SystemDevice", system, path);
    return path;
}

VendorObjects::Path VendorObjects::extent(const Path& drive, const std::string& deviceId) {
    const Path path = object("StorageExtent", "DeviceID", deviceId,
                             {{"NumberOfBlocks", CimValue::uint64(2000)},
                              {"ConsumableBlocks", CimValue::uint64(1900)},
                              {"Primordial", CimValue::boolean(false)},
                              {"ExtentStatus", CimValue::uint16Array({2})}});
    link("CIM_MediaPresent", drive, path);
    return path;
}

void VendorObjects::inPool(const Path& extent, const Path& pool) {
    link("CIM_ConcreteComponent", pool, extent);
}

VendorObjects::Path VendorObjects::slot(const Path& drive, const std::string& tag,
                                        std::uint16_t number) {
    const Path package = object("PhysicalPackage", "Tag", "package-" + tag);
    link("CIM_Realizes", package, drive);
    const Path path = object("Slot", "Tag", "slot-" + tag, {{"Number", CimValue::uint16(number)}});
    link("CIM_PackageInConnector", path, package);
    return path;
}

void VendorObjects::inChassis(const Path& slot, const Path& chassis) {
    link("CIM_Container", chassis, slot);
}

VendorObjects::Path VendorObjects::volume(const Path& system, const std::string& deviceId) {
    const Path path = object("StorageVolume", "DeviceID", deviceId,
                             {{"ElementName", CimValue::string("data" + deviceId)},
                              {"Name", CimValue::string("naa.600" + deviceId)},
                              {"NameFormat", CimValue::uint16(9)},
                              {"NameNameSpace", CimValue::uint16(2)},
                              {"NumberOfBlocks", CimValue::uint64(4000)},
                              {"ConsumableBlocks", CimValue::uint64(3900)},
                              {"DataRedundancy", CimValue::uint16(1)},
                              {"PackageRedundancy", CimValue::uint16(1)},
                              {"IsBasedOnUnderlyingRedundancy", CimValue::boolean(true)},
                              {"DeltaReservation", CimValue::uint8(100)},
                              {"Primordial", CimValue::boolean(false)},
                              {"OperationalStatus", CimValue::uint16Array({2})},
                              {"ExtentStatus", CimValue::uint16Array({2})}});
    link("CIM_SystemDevice", system, path);
    return path;
}

VendorObjects::Path VendorObjects::setting(const Path& volume, const std::string& id,
                                           const std::string& raidLevel) {
    const Path path = object("StorageSetting", "InstanceID", id,
                             {{"ElementName", CimValue::string(raidLevel)}});
    link("CIM_ElementSettingData", volume, path);
    return path;
}

void VendorObjects::fromPool(const Path& volume, const Path& pool) {
    link("CIM_AllocatedFromStoragePool", pool, volume);
}

VendorObjects::Path VendorObjects::port(const Path& system, const std::string& deviceId,
                                        const std::string& name) {
    const Path path = object("SASSATAPort", "DeviceID", deviceId,
                             {{"ElementName", CimValue::string(name)},
                              {"PortType", CimValue::uint16(94)},
                              {"UsageRestriction", CimValue::uint16(2)},
                              {"OperationalStatus", CimValue::uint16Array({2})}});
    link("CIM_SystemDevice", system, path);
    return path;
}

VendorObjects::Path VendorObjects::battery(const Path& system, const std::string& deviceId,
                                           std::uint16_t batteryStatus) {
    const Path path = object("Battery", "DeviceID", deviceId,
                             {{"BatteryStatus", CimValue::uint16(batteryStatus)},
                              {"OperationalStatus", CimValue::uint16Array({2})}});
    link("CIM_SystemDevice", system, path);
    return path;
}

}  // namespace plexortest
