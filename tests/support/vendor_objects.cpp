#include "vendor_objects.h"

namespace plexortest {

using testbed::CimValue;
using testbed::NamedValue;
using testbed::ObjectPath;

namespace {

constexpr char kHostNamespace[] = "root/cimv2";
constexpr char kProfileNamespace[] = "root/interop";
constexpr char kHostClass[] = "OMC_UnitaryComputerSystem";

CimValue text(const std::string& value) {
    return CimValue::string(value);
}
CimValue status(std::uint16_t value) {
    return CimValue::uint16Array({value});
}

ObjectPath pathOf(const std::string& nameSpace, const std::string& className,
                  const std::vector<NamedValue>& keys) {
    return ObjectPath{nameSpace, className, keys};
}

ObjectPath physicalPath(const std::string& cimClass, const std::string& tag) {
    const std::string className = vendorClass(cimClass);
    return pathOf(kVendorNamespace, className,
                  {{"CreationClassName", text(className)}, {"Tag", text(tag)}});
}

ObjectPath identifiedPath(const std::string& cimClass, const std::string& instanceID) {
    return pathOf(kVendorNamespace, vendorClass(cimClass), {{"InstanceID", text(instanceID)}});
}

struct Roles {
    const char* association;
    const char* left;
    const char* right;
};

constexpr Roles kRoles[] = {
    {"CIM_SystemDevice", "GroupComponent", "PartComponent"},
    {"CIM_HostedStoragePool", "GroupComponent", "PartComponent"},
    {"CIM_ConcreteComponent", "GroupComponent", "PartComponent"},
    {"CIM_Container", "GroupComponent", "PartComponent"},
    {"CIM_LogicalIdentity", "SystemElement", "SameElement"},
    {"CIM_ElementConformsToProfile", "ConformantStandard", "ManagedElement"},
    {"CIM_ElementSettingData", "ManagedElement", "SettingData"},
};

Roles rolesOf(const std::string& association) {
    for (const Roles& roles : kRoles) {
        if (association == roles.association) return roles;
    }
    return {association.c_str(), "Antecedent", "Dependent"};
}

}  // namespace

VendorObjects::VendorObjects(testbed::Repository& repository) : repository_(repository) {
    defineVendorClasses(repository_, kVendorNamespace);
    defineVendorClasses(repository_, kProfileNamespace);
    testbed::ClassDefinition hostClass;
    hostClass.name = kHostClass;
    repository_.defineClass(kHostNamespace, hostClass);
}

ObjectPath VendorObjects::put(ObjectPath path, const std::vector<NamedValue>& properties) {
    testbed::Instance instance;
    instance.path = path;
    instance.properties = path.keys;
    for (const NamedValue& property : properties) instance.set(property.first, property.second);
    repository_.put(std::move(instance));
    return path;
}

void VendorObjects::tie(const std::string& cimAssociation, const ObjectPath& left,
                        const ObjectPath& right) {
    const Roles roles = rolesOf(cimAssociation);
    repository_.associate(vendorClass(cimAssociation), {roles.left, left}, {roles.right, right});
}

void VendorObjects::tieIfNamed(const std::string& cimAssociation, const ObjectPath& left,
                               const ObjectPath& right) {
    if (!left.className.empty() && !right.className.empty()) tie(cimAssociation, left, right);
}

ObjectPath VendorObjects::devicePath(const std::string& cimClass, const std::string& deviceID) {
    const std::string className = vendorClass(cimClass);
    return pathOf(kVendorNamespace, className,
                  {{"SystemCreationClassName", text("Sample_ComputerSystem")},
                   {"SystemName", text("sample")},
                   {"CreationClassName", text(className)},
                   {"DeviceID", text(deviceID)}});
}

ObjectPath VendorObjects::device(const VendorController& controller, const std::string& cimClass,
                                 const std::string& deviceID,
                                 const std::vector<NamedValue>& properties) {
    const ObjectPath path = put(devicePath(cimClass, deviceID), properties);
    tieIfNamed("CIM_SystemDevice", controller.system, path);
    return path;
}

ObjectPath VendorObjects::host(const std::string& name) {
    return put(pathOf(kHostNamespace, kHostClass,
                      {{"CreationClassName", text(kHostClass)}, {"Name", text(name)}}),
               {{"ElementName", text("host")}});
}

ObjectPath VendorObjects::profile(const std::string& name, const std::string& instanceID) {
    return put(
        pathOf(kProfileNamespace, "Sample_RegisteredProfile", {{"InstanceID", text(instanceID)}}),
        {{"RegisteredName", text(name)},
         {"RegisteredOrganization", CimValue::uint16(11)},
         {"RegisteredVersion", text("1.0.0")}});
}

ObjectPath VendorObjects::portController(const std::string& deviceID) {
    return put(devicePath("CIM_PortController", deviceID), {});
}

VendorController VendorObjects::controller(const std::string& deviceID, const ObjectPath& profile) {
    VendorController controller;
    controller.port = portController(deviceID);
    controller.system = put(pathOf(kVendorNamespace, "Sample_ComputerSystem",
                                   {{"CreationClassName", text("Sample_ComputerSystem")},
                                    {"Name", text("system-" + deviceID)}}),
                            {{"OperationalStatus", status(2)}});
    controller.package =
        put(physicalPath("CIM_PhysicalPackage", "card-" + deviceID),
            {{"Model", text("Model " + deviceID)}, {"HealthState", CimValue::uint16(5)}});
    tie("CIM_LogicalIdentity", controller.port, controller.system);
    tie("CIM_Realizes", controller.package, controller.port);
    tieIfNamed("CIM_ElementConformsToProfile", profile, controller.port);
    return controller;
}

ObjectPath VendorObjects::software(const ObjectPath& system, std::uint16_t classification,
                                   const std::string& version) {
    const ObjectPath path = put(identifiedPath("CIM_SoftwareIdentity", "software-" + version),
                                {{"Classifications", CimValue::uint16Array({classification})},
                                 {"VersionString", text(version)}});
    tie("CIM_ElementSoftwareIdentity", path, system);
    return path;
}

ObjectPath VendorObjects::pool(const VendorController& controller, const std::string& instanceID,
                               bool primordial) {
    const ObjectPath path = put(identifiedPath("CIM_StoragePool", instanceID),
                                {{"PoolID", text("Pool " + instanceID)},
                                 {"Primordial", CimValue::boolean(primordial)},
                                 {"TotalManagedSpace", CimValue::uint64(1000)},
                                 {"RemainingManagedSpace", CimValue::uint64(400)},
                                 {"OperationalStatus", status(2)}});
    tieIfNamed("CIM_HostedStoragePool", controller.system, path);
    return path;
}

ObjectPath VendorObjects::chassis(const VendorController& controller, const std::string& tag) {
    const ObjectPath path =
        put(physicalPath("CIM_Chassis", tag), {{"OperationalStatus", status(2)}});
    tieIfNamed("CIM_SystemPackaging", path, controller.system);
    return path;
}

VendorDrive VendorObjects::drive(const VendorController& controller, const std::string& deviceID,
                                 const ObjectPath& pool, const ObjectPath& chassis,
                                 std::uint16_t slot) {
    VendorDrive drive;
    drive.drive = device(controller, "CIM_DiskDrive", deviceID,
                         {{"Name", text("Disk " + deviceID)},
                          {"EnabledState", CimValue::uint16(2)},
                          {"OperationalStatus", status(2)}});
    drive.extent = put(devicePath("CIM_StorageExtent", "extent-" + deviceID),
                       {{"NumberOfBlocks", CimValue::uint64(2000)},
                        {"ConsumableBlocks", CimValue::uint64(1000)},
                        {"Primordial", CimValue::boolean(true)},
                        {"ExtentStatus", status(2)}});
    drive.software = software(drive.drive, 10, "FW-" + deviceID);
    drive.package = put(physicalPath("CIM_PhysicalPackage", "package-" + deviceID), {});
    drive.slot =
        put(physicalPath("CIM_Slot", "slot-" + deviceID), {{"Number", CimValue::uint16(slot)}});
    tie("CIM_MediaPresent", drive.drive, drive.extent);
    tie("CIM_Realizes", drive.package, drive.drive);
    tie("CIM_PackageInConnector", drive.slot, drive.package);
    tieIfNamed("CIM_Container", chassis, drive.slot);
    tieIfNamed("CIM_ConcreteComponent", pool, drive.extent);
    return drive;
}

VendorVolume VendorObjects::volume(const VendorController& controller, const std::string& deviceID,
                                   const ObjectPath& pool, const std::string& raidLevel) {
    VendorVolume volume;
    volume.volume = device(controller, "CIM_StorageVolume", deviceID,
                           {{"ElementName", text("Volume " + deviceID)},
                            {"Name", text("Name " + deviceID)},
                            {"NameFormat", CimValue::uint16(2)},
                            {"NameNameSpace", CimValue::uint16(7)},
                            {"NumberOfBlocks", CimValue::uint64(5000)},
                            {"ConsumableBlocks", CimValue::uint64(100)},
                            {"DataRedundancy", CimValue::uint16(1)},
                            {"PackageRedundancy", CimValue::uint16(2)},
                            {"IsBasedOnUnderlyingRedundancy", CimValue::boolean(true)},
                            {"DeltaReservation", CimValue::uint8(3)},
                            {"Primordial", CimValue::boolean(false)},
                            {"OperationalStatus", status(2)},
                            {"ExtentStatus", status(2)}});
    volume.setting = put(identifiedPath("CIM_StorageSetting", "setting-" + deviceID),
                         {{"ElementName", text(raidLevel)}});
    tie("CIM_ElementSettingData", volume.volume, volume.setting);
    tieIfNamed("CIM_AllocatedFromStoragePool", pool, volume.volume);
    return volume;
}

ObjectPath VendorObjects::port(const VendorController& controller, const std::string& deviceID) {
    return device(controller, "CIM_SASSATAPort", deviceID,
                  {{"ElementName", text("Port " + deviceID)},
                   {"PortType", CimValue::uint16(94)},
                   {"UsageRestriction", CimValue::uint16(2)},
                   {"OperationalStatus", status(2)}});
}

ObjectPath VendorObjects::battery(const VendorController& controller, const std::string& deviceID) {
    return device(controller, "CIM_Battery", deviceID,
                  {{"BatteryStatus", CimValue::uint16(3)}, {"OperationalStatus", status(2)}});
}

ObjectPath VendorObjects::fan(const VendorController& controller, const std::string& deviceID) {
    return device(controller, "CIM_Fan", deviceID, {{"OperationalStatus", status(2)}});
}

}  // namespace plexortest
