// The objects of pools, drives and volumes: extents, firmware, slots, settings.
#include "vendor_graphs.h"

namespace testbed {
namespace {

/// Paths of the pools that a drive or a volume names.
std::vector<ObjectPath> poolPaths(const Naming& naming, const ControllerDescription& controller,
                                  const std::vector<std::string>& ids) {
    std::vector<ObjectPath> paths;
    for (const std::string& id : ids) {
        if (const PoolDescription* pool = findById(controller.pools, id)) {
            paths.push_back(naming.pool(controller, *pool));
        }
    }
    return paths;
}

void addExtent(ObjectGraph& graph, const Naming& naming, const ControllerDescription& controller,
               const DriveDescription& drive) {
    const ObjectPath path = naming.driveExtent(controller, drive);
    graph.add("CIM_StorageExtent", path,
              {{"BlockSize", CimValue::uint64(512)},
               {"NumberOfBlocks", CimValue::uint64(drive.blocks)},
               {"ConsumableBlocks", CimValue::uint64(drive.consumableBlocks)},
               {"Primordial", CimValue::boolean(drive.primordial)},
               {"ExtentStatus", CimValue::uint16Array({drive.extentStatus})}},
              drive.part("extent"));
    graph.link("CIM_MediaPresent", naming.drive(controller, drive), path);
    for (const ObjectPath& pool : poolPaths(naming, controller, drive.pools)) {
        graph.link("CIM_ConcreteComponent", pool, path);
    }
}

void addFirmware(ObjectGraph& graph, const Naming& naming, const ControllerDescription& controller,
                 const DriveDescription& drive) {
    const ObjectPath path = naming.driveFirmware(controller, drive);
    graph.add("CIM_SoftwareIdentity", path,
              {{"Classifications", CimValue::uint16Array({10})},
               {"VersionString", CimValue::string(*drive.firmware)}},
              drive.part("software"));
    graph.link("CIM_ElementSoftwareIdentity", path, naming.drive(controller, drive));
}

void addSlot(ObjectGraph& graph, const Naming& naming, const ControllerDescription& controller,
             const DriveDescription& drive) {
    const ObjectPath slot = naming.driveSlot(controller, drive);
    graph.add("CIM_Slot", slot, {{"Number", CimValue::uint16(*drive.slot)}},
              drive.part("slotObject"));
    graph.link("CIM_PackageInConnector", slot, naming.drivePackage(controller, drive));
    if (const EnclosureDescription* enclosure = findById(controller.enclosures, drive.enclosure)) {
        graph.link("CIM_Container", naming.enclosure(controller, *enclosure), slot);
    }
}

void addPackage(ObjectGraph& graph, const Naming& naming, const ControllerDescription& controller,
                const DriveDescription& drive) {
    const ObjectPath path = naming.drivePackage(controller, drive);
    graph.add("CIM_PhysicalPackage", path, {}, drive.part("package"));
    graph.link("CIM_Realizes", path, naming.drive(controller, drive));
    if (drive.slot) addSlot(graph, naming, controller, drive);
}

std::vector<NamedValue> volumeProperties(const VolumeDescription& volume) {
    return {
        {"ElementName", CimValue::string(volume.name)},
        {"Name", CimValue::string(volume.uniqueName)},
        {"NameFormat", CimValue::uint16(volume.nameFormat)},
        {"NameNameSpace", CimValue::uint16(volume.nameNameSpace)},
        {"BlockSize", CimValue::uint64(512)},
        {"NumberOfBlocks", CimValue::uint64(volume.blocks)},
        {"ConsumableBlocks", CimValue::uint64(volume.consumableBlocks)},
        {"DataRedundancy", CimValue::uint16(volume.dataRedundancy)},
        {"PackageRedundancy", CimValue::uint16(volume.packageRedundancy)},
        {"IsBasedOnUnderlyingRedundancy", CimValue::boolean(volume.basedOnUnderlyingRedundancy)},
        {"DeltaReservation", CimValue::uint8(volume.deltaReservation)},
        {"Primordial", CimValue::boolean(volume.primordial)},
        {"OperationalStatus", CimValue::uint16Array({volume.operationalStatus})},
        {"ExtentStatus", CimValue::uint16Array({volume.extentStatus})}};
}

}  // namespace

ObjectGraph poolGraph(const Naming& naming, const ControllerDescription& controller,
                      const PoolDescription& pool) {
    ObjectGraph graph(naming);
    const ObjectPath path = naming.pool(controller, pool);
    graph.add("CIM_StoragePool", path,
              {{"PoolID", CimValue::string(pool.id)},
               {"TotalManagedSpace", CimValue::uint64(pool.total)},
               {"RemainingManagedSpace", CimValue::uint64(pool.remaining)},
               {"Primordial", CimValue::boolean(pool.primordial)},
               {"OperationalStatus", CimValue::uint16Array({pool.operationalStatus})}},
              pool.tweaks);
    graph.link("CIM_HostedStoragePool", naming.system(controller), path);
    return graph;
}

ObjectGraph driveGraph(const Naming& naming, const ControllerDescription& controller,
                       const DriveDescription& drive) {
    ObjectGraph graph(naming);
    const ObjectPath path = naming.drive(controller, drive);
    graph.add("CIM_DiskDrive", path,
              {{"Name", CimValue::string(drive.name)},
               {"EnabledState", CimValue::uint16(drive.enabledState)},
               {"OperationalStatus", CimValue::uint16Array({drive.operationalStatus})}},
              drive.tweaks);
    if (!drive.noMedia) addExtent(graph, naming, controller, drive);
    if (drive.firmware) addFirmware(graph, naming, controller, drive);
    if (!drive.noPackage) addPackage(graph, naming, controller, drive);
    // The system lists the drive last, when all that it leads to exists.
    graph.link("CIM_SystemDevice", naming.system(controller), path);
    return graph;
}

ObjectGraph volumeGraph(const Naming& naming, const ControllerDescription& controller,
                        const VolumeDescription& volume) {
    ObjectGraph graph(naming);
    const ObjectPath path = naming.volume(controller, volume);
    graph.add("CIM_StorageVolume", path, volumeProperties(volume), volume.tweaks);
    if (volume.raidLevel) {
        const ObjectPath setting = naming.volumeSetting(controller, volume);
        graph.add("CIM_StorageSetting", setting,
                  {{"ElementName", CimValue::string(*volume.raidLevel)},
                   {"DataRedundancyGoal", CimValue::uint16(volume.dataRedundancy)},
                   {"PackageRedundancyGoal", CimValue::uint16(volume.packageRedundancy)}},
                  volume.part("setting"));
        graph.link("CIM_ElementSettingData", path, setting);
    }
    for (const ObjectPath& pool : poolPaths(naming, controller, volume.pools)) {
        graph.link("CIM_AllocatedFromStoragePool", pool, path);
    }
    graph.link("CIM_SystemDevice", naming.system(controller), path);
    return graph;
}

}  // namespace testbed
