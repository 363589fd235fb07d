#include "cache_state.h"

#include <sstream>

#include "PlexorProviderUtil.h"

namespace modeltest {
namespace {

Text textOf(const char* text) {
    return text != nullptr ? Text(text) : std::nullopt;
}

std::string classOf(const CMPIObjectPath* path) {
    const char* name = ClassNameText(path);
    return name != nullptr ? name : "";
}

template <typename State, typename Record>
std::vector<State> readList(const List_t* list, State (*read)(const Record&)) {
    std::vector<State> states;
    for (const List_Entry_t* entry = list->Head; entry != nullptr; entry = entry->Next)
        states.push_back(read(*static_cast<const Record*>(entry->Data)));
    return states;
}

PoolState readPool(const StoragePool_t& pool) {
    PoolState state{classOf(pool.PoolOp),
                    pool.InstanceID,
                    pool.PoolID,
                    pool.Primordial != 0,
                    pool.OperationalStatus,
                    pool.TotalManagedSpace,
                    pool.RemainingManagedSpace,
                    {}};
    for (const List_Entry_t* entry = pool.Drives->Head; entry != nullptr; entry = entry->Next)
        state.members.emplace_back(static_cast<const char*>(entry->Data));
    return state;
}

DriveState readDrive(const DiskDrive_t& disk) {
    DriveState state;
    state.className = classOf(disk.DiskOp);
    state.id = disk.DeviceID;
    state.name = textOf(disk.Name);
    state.firmware = textOf(disk.FwVersion);
    state.chassis = textOf(disk.Chassis);
    state.pool = textOf(disk.Pool);
    state.operationalStatus = disk.OperationalStatus;
    state.extentStatus = disk.ExtentStatus;
    state.enabledState = disk.EnabledState;
    state.slot = disk.SlotNumber;
    state.blocks = disk.NumberOfBlocks;
    state.consumable = disk.ConsumableBlocks;
    state.primordial = disk.Primordial != 0;
    return state;
}

VolumeState readVolume(const StorageVolume_t& volume) {
    VolumeState state;
    state.className = classOf(volume.VolumeOp);
    state.id = volume.DeviceID;
    state.elementName = textOf(volume.ElementName);
    state.name = textOf(volume.Name);
    state.raidLevel = textOf(volume.RaidLevel);
    state.pool = textOf(volume.FromPool);
    state.operationalStatus = volume.OperationalStatus;
    state.extentStatus = volume.ExtentStatus;
    state.blocks = volume.NumberOfBlocks;
    state.consumable = volume.ConsumableBlocks;
    return state;
}

PortState readPort(const SASSATAPort_t& port) {
    return {classOf(port.PortOp), port.DeviceID, textOf(port.PortName), port.OperationalStatus,
            port.PortType};
}

BatteryState readBattery(const Battery_t& battery) {
    return {classOf(battery.BatteryOp), battery.DeviceID, battery.OperationalStatus,
            battery.BatteryStatus};
}

std::string shown(const Text& text) {
    return text ? *text : "NULL";
}

}  // namespace

std::vector<ControllerState> readCache() {
    std::vector<ControllerState> controllers;
    const List_Entry_t* entry = RaidControllerList->Head;
    for (; entry != nullptr; entry = entry->Next) {
        const auto& ctrl = *static_cast<const RaidController_t*>(entry->Data);
        controllers.push_back(
            {ctrl.DeviceID, ctrl.Model, readList(ctrl.PoolList, readPool),
             readList(ctrl.DiskList, readDrive), readList(ctrl.VolumeList, readVolume),
             readList(ctrl.PortList, readPort), readList(ctrl.BatteryList, readBattery)});
    }
    return controllers;
}

std::string describe(const ControllerState& controller) {
    std::ostringstream out;
    out << "controller " << controller.id << "\n";
    for (const PoolState& pool : controller.pools) {
        out << "  pool " << pool.instanceId << " total " << pool.total << " members";
        for (const std::string& member : pool.members) out << " " << member;
        out << "\n";
    }
    for (const DriveState& drive : controller.drives)
        out << "  drive " << drive.id << " (" << drive.className << ") op "
            << drive.operationalStatus << " ext " << drive.extentStatus << " pool "
            << shown(drive.pool) << " fw " << shown(drive.firmware) << "\n";
    for (const VolumeState& volume : controller.volumes)
        out << "  volume " << volume.id << " \"" << shown(volume.elementName) << "\" op "
            << volume.operationalStatus << " ext " << volume.extentStatus << " blocks "
            << volume.blocks << "/" << volume.consumable << " pool " << shown(volume.pool) << "\n";
    for (const PortState& port : controller.ports)
        out << "  port " << port.id << " op " << port.operationalStatus << "\n";
    for (const BatteryState& battery : controller.batteries)
        out << "  battery " << battery.id << " op " << battery.operationalStatus << " status "
            << battery.batteryStatus << "\n";
    return out.str();
}

}  // namespace modeltest
