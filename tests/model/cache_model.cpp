#include "cache_model.h"

#include <algorithm>
#include <utility>

namespace modeltest {

using testbed::AssociationFilter;
using testbed::CimValue;
using testbed::Instance;
using testbed::ObjectPath;

namespace {

struct WalkClasses {
    const char* assocClass;
    const char* resultClass;
    const char* key;
};

const std::map<Kind, WalkClasses> kWalks = {
    {Kind::Pool, {"CIM_HostedStoragePool", "CIM_StoragePool", "InstanceID"}},
    {Kind::Drive, {"CIM_SystemDevice", "CIM_DiskDrive", "DeviceID"}},
    {Kind::Volume, {"CIM_SystemDevice", "CIM_StorageVolume", "DeviceID"}},
    {Kind::Port, {"CIM_SystemDevice", "CIM_SASSATAPort", "DeviceID"}},
    {Kind::Battery, {"CIM_SystemDevice", "CIM_Battery", "DeviceID"}},
};

/// What is refreshed for a request, in order.
const std::map<Kind, std::vector<Kind>> kChains = {
    {Kind::Drive, {Kind::Pool, Kind::Drive}},
    {Kind::Volume, {Kind::Pool, Kind::Drive, Kind::Volume}},
    {Kind::Port, {Kind::Port}},
    {Kind::Battery, {Kind::Battery}},
};

std::uint64_t number(const Instance& inst, const char* name) {
    const CimValue* value = inst.find(name);
    return value != nullptr ? value->asUnsigned() : 0;
}

Text text(const Instance& inst, const char* name) {
    const CimValue* value = inst.find(name);
    return value != nullptr && !value->isNull ? Text(value->asString()) : std::nullopt;
}

std::string keyOf(const Instance& inst, const char* name) {
    const CimValue* value = inst.path.findKey(name);
    return value != nullptr ? value->asString() : "";
}

/// A text as the log shows it.
std::string shown(const Text& value) {
    return value ? *value : "NULL";
}

std::string str(std::uint64_t value) {
    return std::to_string(value);
}

PoolState* findPool(ControllerState& ctrl, const Text& id) {
    if (!id) return nullptr;
    for (PoolState& pool : ctrl.pools)
        if (pool.instanceId == *id) return &pool;
    return nullptr;
}

void join(PoolState* pool, const std::string& drive) {
    if (pool == nullptr) return;
    if (std::find(pool->members.begin(), pool->members.end(), drive) == pool->members.end())
        pool->members.push_back(drive);
}

void leave(PoolState* pool, const std::string& drive) {
    if (pool == nullptr) return;
    const auto found = std::find(pool->members.begin(), pool->members.end(), drive);
    if (found != pool->members.end()) pool->members.erase(found);
}

}  // namespace

CacheModel::CacheModel(testbed::Repository& repository, const testbed::Naming& naming,
                       const testbed::Scenario& scenario, std::time_t interval)
    : repository_(repository), naming_(naming), scenario_(scenario), interval_(interval) {}

std::vector<std::string> CacheModel::takeLines() {
    return std::exchange(lines_, {});
}

std::vector<Instance> CacheModel::related(const ObjectPath& path, const char* assocClass,
                                          const char* resultClass) const {
    AssociationFilter filter;
    filter.assocClass = assocClass;
    if (resultClass != nullptr) filter.resultClass = resultClass;
    return repository_.associators(path, filter);
}

std::vector<std::string> CacheModel::poolIds(const ObjectPath& path, const char* assocClass) const {
    std::vector<std::string> ids;
    for (const Instance& pool : related(path, assocClass, "CIM_StoragePool"))
        ids.push_back(keyOf(pool, "InstanceID"));
    return ids;
}

std::vector<Instance> CacheModel::walk(std::size_t index, Kind kind) const {
    const WalkClasses& classes = kWalks.at(kind);
    return related(naming_.system(scenario_.controllers[index]), classes.assocClass,
                   classes.resultClass);
}

void CacheModel::buildInventory(std::time_t now) {
    for (std::size_t i = 0; i < scenario_.controllers.size(); i++) {
        controllers_.push_back(
            {scenario_.controllers[i].id, scenario_.controllers[i].model, {}, {}, {}, {}, {}});
        for (const Instance& pool : walk(i, Kind::Pool)) buildPool(controllers_[i], pool);
        // One walk over all devices, each kind's records in the order in which they come.
        for (Kind kind : {Kind::Drive, Kind::Volume, Kind::Port, Kind::Battery})
            for (const Instance& inst : walk(i, kind)) build(controllers_[i], kind, inst);
        times_.emplace_back();
        for (const auto& [kind, classes] : kWalks) times_[i].last[kind] = now;
    }
    lines_.clear();  // the order of lines across kinds is the vendor's
}

void CacheModel::request(Kind kind, std::time_t now) {
    // All controllers are looked at before the first refresh runs.
    std::vector<std::size_t> due;
    for (std::size_t i = 0; i < controllers_.size(); i++)
        if (now - times_[i].last[kind] >= interval_) due.push_back(i);
    for (std::size_t i : due)
        for (Kind step : kChains.at(kind)) refresh(i, step, now);
}

void CacheModel::refresh(std::size_t index, Kind kind, std::time_t now) {
    std::time_t& last = times_[index].last[kind];
    if (now < last + interval_) return;
    last = now;
    if (failingWalks_[kind] > 0) {
        failingWalks_[kind]--;
        return;
    }
    reconcile(index, kind);
}

void CacheModel::reconcile(std::size_t index, Kind kind) {
    ControllerState& ctrl = controllers_[index];
    const char* key = kWalks.at(kind).key;
    std::vector<Instance> fresh = walk(index, kind);
    std::vector<bool> taken(fresh.size(), false);

    // Finds the fresh instance of a cached record; its place or -1.
    const auto match = [&](const std::string& className, const std::string& id) {
        for (std::size_t j = 0; j < fresh.size(); j++) {
            if (taken[j] || fresh[j].path.className != className || keyOf(fresh[j], key) != id)
                continue;
            taken[j] = true;
            return static_cast<int>(j);
        }
        return -1;
    };
    // All records are matched before the first is touched; removal works by identity.
    const auto pass = [&](auto& records, auto idOf, auto update, auto remove) {
        std::vector<int> matches;
        for (const auto& record : records) matches.push_back(match(record.className, idOf(record)));
        std::size_t at = 0;
        for (int j : matches) {
            if (j >= 0) {
                update(records[at], fresh[static_cast<std::size_t>(j)]);
                at++;
            } else {
                remove(at);
            }
        }
    };
    const auto deviceId = [](const auto& record) { return record.id; };
    const auto nothing = [](auto&, const Instance&) {};

    switch (kind) {
        case Kind::Pool:
            pass(
                ctrl.pools, [](const PoolState& pool) { return pool.instanceId; }, nothing,
                [&](std::size_t i) { removePool(ctrl, i); });
            break;
        case Kind::Drive:
            pass(
                ctrl.drives, deviceId,
                [&](DriveState& drive, const Instance& inst) { updateDrive(ctrl, drive, inst); },
                [&](std::size_t i) { removeDrive(ctrl, i); });
            break;
        case Kind::Volume:
            pass(
                ctrl.volumes, deviceId,
                [&](VolumeState& volume, const Instance& inst) { updateVolume(volume, inst); },
                [&](std::size_t i) { removeVolume(ctrl, i); });
            break;
        case Kind::Port:
            pass(ctrl.ports, deviceId, nothing, [&](std::size_t i) { removePort(ctrl, i); });
            break;
        case Kind::Battery:
            pass(
                ctrl.batteries, deviceId,
                [&](BatteryState& battery, const Instance& inst) { updateBattery(battery, inst); },
                [&](std::size_t i) { removeBattery(ctrl, i); });
            break;
    }
    for (std::size_t j = 0; j < fresh.size(); j++)
        if (!taken[j]) build(ctrl, kind, fresh[j]);
}

void CacheModel::build(ControllerState& ctrl, Kind kind, const Instance& inst) {
    switch (kind) {
        case Kind::Pool:
            return buildPool(ctrl, inst);
        case Kind::Drive:
            return buildDrive(ctrl, inst);
        case Kind::Volume:
            return buildVolume(ctrl, inst);
        case Kind::Port:
            return buildPort(ctrl, inst);
        case Kind::Battery:
            return buildBattery(ctrl, inst);
    }
}

void CacheModel::buildPool(ControllerState& ctrl, const Instance& inst) {
    ctrl.pools.push_back({inst.path.className,
                          keyOf(inst, "InstanceID"),
                          *text(inst, "PoolID"),
                          number(inst, "Primordial") != 0,
                          number(inst, "OperationalStatus"),
                          number(inst, "TotalManagedSpace"),
                          number(inst, "RemainingManagedSpace"),
                          {}});
    line("BuildSinglePoolInfo: pool @ added to the list");
}

void CacheModel::buildDrive(ControllerState& ctrl, const Instance& inst) {
    const std::vector<Instance> media = related(inst.path, "CIM_MediaPresent");
    // A drive that is turned away leaves the log line of its release.
    const auto reject = [&] { line(shown(text(inst, "Name")) + " deleted"); };
    if (media.empty()) return reject();
    const Instance& extent = media.front();
    DriveState drive;
    drive.className = inst.path.className;
    drive.id = *text(inst, "DeviceID");
    drive.name = text(inst, "Name");
    drive.enabledState = number(inst, "EnabledState");
    drive.operationalStatus = number(inst, "OperationalStatus");
    drive.blocks = number(extent, "NumberOfBlocks");
    drive.consumable = number(extent, "ConsumableBlocks");
    drive.primordial = number(extent, "Primordial") != 0;
    drive.extentStatus = number(extent, "ExtentStatus");
    const auto firmware = related(inst.path, "CIM_ElementSoftwareIdentity", "CIM_SoftwareIdentity");
    if (!firmware.empty()) drive.firmware = text(firmware.front(), "VersionString");
    const auto packages = related(inst.path, "CIM_Realizes", "CIM_PhysicalPackage");
    if (!packages.empty()) {
        const auto slots = related(packages.front().path, "CIM_PackageInConnector", "CIM_Slot");
        if (!slots.empty()) {
            drive.slot = number(slots.front(), "Number");
            const auto chassis = related(slots.front().path, "CIM_Container", "CIM_Chassis");
            if (!chassis.empty()) drive.chassis = keyOf(chassis.front(), "Tag");
        }
    }
    PoolState* pool = nullptr;
    for (const std::string& id : poolIds(extent.path, "CIM_ConcreteComponent")) {
        drive.pool = id;
        pool = findPool(ctrl, drive.pool);
        if (pool != nullptr) break;
    }
    if (!drive.pool) return reject();
    join(pool, drive.id);
    extents_[ctrl.id + drive.className + drive.id] = extent.path;
    ctrl.drives.push_back(drive);
    line("BuildDiskInfo: disk @ added to the list @");
}

void CacheModel::buildVolume(ControllerState& ctrl, const Instance& inst) {
    const auto pools = poolIds(inst.path, "CIM_AllocatedFromStoragePool");
    if (pools.empty()) return;
    VolumeState volume;
    volume.className = inst.path.className;
    volume.id = *text(inst, "DeviceID");
    volume.elementName = text(inst, "ElementName");
    volume.name = text(inst, "Name");
    volume.operationalStatus = number(inst, "OperationalStatus");
    volume.extentStatus = number(inst, "ExtentStatus");
    volume.blocks = number(inst, "NumberOfBlocks");
    volume.consumable = number(inst, "ConsumableBlocks");
    const auto settings = related(inst.path, "CIM_ElementSettingData", "CIM_StorageSetting");
    if (!settings.empty()) volume.raidLevel = text(settings.front(), "ElementName");
    volume.pool = pools.front();
    ctrl.volumes.push_back(volume);
    line("BuildVolumeInfo: volume @ added to the list");
}

void CacheModel::buildPort(ControllerState& ctrl, const Instance& inst) {
    ctrl.ports.push_back({inst.path.className, *text(inst, "DeviceID"), text(inst, "ElementName"),
                          number(inst, "OperationalStatus"), number(inst, "PortType")});
    line("BuildPortInfo: port @ added to the list");
}

void CacheModel::buildBattery(ControllerState& ctrl, const Instance& inst) {
    ctrl.batteries.push_back({inst.path.className, *text(inst, "DeviceID"),
                              number(inst, "OperationalStatus"), number(inst, "BatteryStatus")});
    line("BuildBatteryInfo: battery @ added to the list");
}

void CacheModel::updateDriveStatus(DriveState& drive, const Instance& inst,
                                   const Instance& extent) {
    const auto operational = number(inst, "OperationalStatus");
    const auto status = number(extent, "ExtentStatus");
    if (operational == drive.operationalStatus && status == drive.extentStatus) return;
    line("CheckAndUpdateDiskInfo: disk " + drive.id + " status changed. Old opStat " +
         str(drive.operationalStatus) + " extStat " + str(drive.extentStatus) + ", new opStat " +
         str(operational) + " extStat " + str(status));
    drive.operationalStatus = operational;
    drive.extentStatus = status;
}

void CacheModel::updateDrive(ControllerState& ctrl, DriveState& drive, const Instance& inst) {
    const ObjectPath& extentPath = extents_.at(ctrl.id + drive.className + drive.id);
    if (failingExtents_ > 0) {
        failingExtents_--;
    } else if (const auto extent = repository_.get(extentPath)) {
        updateDriveStatus(drive, inst, *extent);
    }
    const auto pools = poolIds(extentPath, "CIM_ConcreteComponent");
    if (pools.empty()) return;
    if (!drive.pool || *drive.pool != pools.front()) {
        line("CheckAndUpdateDiskInfo: disk " + drive.id + " pool changed, old " +
             shown(drive.pool) + ", new " + pools.front());
        leave(findPool(ctrl, drive.pool), drive.id);
        drive.pool = pools.front();
    }
    join(findPool(ctrl, drive.pool), drive.id);
}

void CacheModel::updateVolume(VolumeState& volume, const Instance& inst) {
    const std::string start = "CheckAndUpdateVolumeInfo: volume " + volume.id + " ";
    const auto operational = number(inst, "OperationalStatus");
    const auto status = number(inst, "ExtentStatus");
    if (operational != volume.operationalStatus || status != volume.extentStatus) {
        line(start + "status changed. Old opStat " + str(volume.operationalStatus) + " extStat " +
             str(volume.extentStatus) + ", new opStat " + str(operational) + " extStat " +
             str(status));
        volume.operationalStatus = operational;
        volume.extentStatus = status;
    }
    const auto blocks = number(inst, "NumberOfBlocks");
    const auto consumable = number(inst, "ConsumableBlocks");
    if (blocks != volume.blocks || consumable != volume.consumable) {
        line(start + "capacity changed. Old total blocs " + str(volume.blocks) + " free blocks " +
             str(volume.consumable) + ", new total blocks " + str(blocks) + " free blocks " +
             str(consumable));
        volume.blocks = blocks;
        volume.consumable = consumable;
    }
    const Text name = text(inst, "ElementName");
    if (name != volume.elementName) {
        line(start + "element name changed. Old name " + shown(volume.elementName) + ", new name " +
             shown(name));
        volume.elementName = name;
    }
}

void CacheModel::updateBattery(BatteryState& battery, const Instance& inst) {
    const auto operational = number(inst, "OperationalStatus");
    const auto status = number(inst, "BatteryStatus");
    if (operational == battery.operationalStatus && status == battery.batteryStatus) return;
    line("CheckAndUpdateBatteryInfo: battery " + battery.id +
         " status changed. Old OperationalStatus " + str(battery.operationalStatus) +
         " BatteryStatust " + str(battery.batteryStatus) + ", new OperationalStatus " +
         str(operational) + " BatteryStatust " + str(status));
    battery.operationalStatus = operational;
    battery.batteryStatus = status;
}

void CacheModel::removePool(ControllerState& ctrl, std::size_t i) {
    line("Pool " + ctrl.pools[i].poolId + " deleted");
    ctrl.pools.erase(ctrl.pools.begin() + static_cast<std::ptrdiff_t>(i));
}

void CacheModel::removeDrive(ControllerState& ctrl, std::size_t i) {
    const DriveState drive = ctrl.drives[i];
    line(shown(drive.name) + " removed from controller " + ctrl.id + "(" + ctrl.model + ")");
    if (PoolState* pool = findPool(ctrl, drive.pool)) {
        leave(pool, drive.id);
        line(shown(drive.name) + " removed from pool " + *drive.pool);
    }
    line(shown(drive.name) + " deleted");
    extents_.erase(ctrl.id + drive.className + drive.id);
    ctrl.drives.erase(ctrl.drives.begin() + static_cast<std::ptrdiff_t>(i));
}

void CacheModel::removeVolume(ControllerState& ctrl, std::size_t i) {
    const VolumeState& volume = ctrl.volumes[i];
    line("Volume " + shown(volume.name) + " (" + shown(volume.elementName) + ") deleted");
    ctrl.volumes.erase(ctrl.volumes.begin() + static_cast<std::ptrdiff_t>(i));
}

void CacheModel::removePort(ControllerState& ctrl, std::size_t i) {
    const PortState& port = ctrl.ports[i];
    line(shown(port.name) + " removed from controller " + ctrl.id + "(" + ctrl.model + ")");
    line(shown(port.name) + " deleted");
    ctrl.ports.erase(ctrl.ports.begin() + static_cast<std::ptrdiff_t>(i));
}

void CacheModel::removeBattery(ControllerState& ctrl, std::size_t i) {
    line("Battery " + ctrl.batteries[i].id + " deleted");
    ctrl.batteries.erase(ctrl.batteries.begin() + static_cast<std::ptrdiff_t>(i));
}

}  // namespace modeltest
