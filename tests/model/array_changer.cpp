#include "array_changer.h"

#include "vendor_graphs.h"

namespace modeltest {

using namespace testbed;

namespace {

constexpr std::size_t kMaxDrives = 12;
constexpr std::size_t kMaxOfAKind = 5;

DriveDescription makeDrive(const std::string& id, const std::string& pool) {
    DriveDescription drive;
    drive.id = id;
    drive.name = "Drive " + id;
    drive.slot = static_cast<std::uint16_t>(std::stoi(id.substr(1)) % 24);
    drive.enclosure = "32";
    if (!pool.empty()) drive.pools = {pool};
    drive.firmware = "FW" + id;
    drive.blocks = 1000;
    drive.consumableBlocks = 990;
    drive.enabledState = 2;
    drive.operationalStatus = 2;
    drive.extentStatus = 2;
    return drive;
}

VolumeDescription makeVolume(const std::string& id, const std::string& pool) {
    VolumeDescription volume;
    volume.id = id;
    volume.name = "data" + id;
    volume.uniqueName = "naa.6" + id;
    volume.raidLevel = "RAID5";
    volume.pools = {pool};
    volume.blocks = 5000;
    volume.consumableBlocks = 4000;
    volume.operationalStatus = 2;
    volume.extentStatus = 2;
    return volume;
}

PoolDescription makePool(const std::string& id, bool primordial) {
    PoolDescription pool;
    pool.id = id;
    pool.primordial = primordial;
    pool.total = 100000;
    pool.remaining = 50000;
    pool.operationalStatus = 2;
    return pool;
}

BatteryDescription makeBattery(const std::string& id) {
    BatteryDescription battery;
    battery.id = id;
    battery.batteryStatus = 2;
    battery.operationalStatus = 2;
    return battery;
}

PortDescription makePort(const std::string& id) {
    PortDescription port;
    port.id = id;
    port.name = "Port " + id;
    port.portType = 94;
    port.operationalStatus = 2;
    return port;
}

ControllerDescription makeController(const std::string& id) {
    ControllerDescription controller;
    controller.id = id;
    controller.model = "Model " + id;
    controller.operationalStatus = 2;
    controller.healthState = 5;
    EnclosureDescription enclosure;
    enclosure.id = "32";
    enclosure.tag = id + "_32";
    controller.enclosures = {enclosure};
    controller.pools = {makePool("primordial", true), makePool("p1", false), makePool("p2", false)};
    for (int i = 0; i < 5; i++)
        controller.drives.push_back(makeDrive("d" + std::to_string(i), i < 3 ? "p1" : "p2"));
    controller.volumes = {makeVolume("0", "p1"), makeVolume("1", "p2")};
    controller.ports = {makePort("0"), makePort("1")};
    controller.batteries = {makeBattery("0")};
    return controller;
}

/// Takes a thing out of the array and puts a changed one in its place.
template <typename Description, typename GraphOf, typename Change>
void exchange(Repository& repository, const Naming& naming, const ControllerDescription& controller,
              Description& thing, GraphOf graphOf, Change change) {
    graphOf(naming, controller, thing).withdraw(repository);
    change(thing);
    graphOf(naming, controller, thing).place(repository);
}

/// Changes properties of a thing whose place and associations stay.
template <typename Description, typename GraphOf, typename Change>
void renew(Repository& repository, const Naming& naming, const ControllerDescription& controller,
           Description& thing, GraphOf graphOf, Change change) {
    change(thing);
    graphOf(naming, controller, thing).renew(repository);
}

template <typename Description, typename GraphOf>
void add(Repository& repository, const Naming& naming, const ControllerDescription& controller,
         std::vector<Description>& list, Description thing, GraphOf graphOf) {
    graphOf(naming, controller, thing).place(repository);
    list.push_back(std::move(thing));
}

template <typename Description, typename GraphOf>
void drop(Repository& repository, const Naming& naming, const ControllerDescription& controller,
          std::vector<Description>& list, std::size_t i, GraphOf graphOf) {
    graphOf(naming, controller, list[i]).withdraw(repository);
    list.erase(list.begin() + static_cast<std::ptrdiff_t>(i));
}

}  // namespace

Scenario ArrayChanger::startingScenario() {
    Scenario scenario;
    scenario.host.id = "host-1";
    scenario.host.elementName = "host-1.example";
    ProfileDescription profile;
    profile.id = "0";
    profile.registeredName = "Host Hardware RAID Controller";
    profile.version = "1.0";
    profile.organization = 2;
    scenario.profiles = {profile};
    scenario.controllers = {makeController("C0"), makeController("C1")};
    return scenario;
}

ArrayChanger::ArrayChanger(testbed::Broker& broker, Scenario& scenario, const Naming& naming,
                           FaultListener& listener, unsigned seed)
    : broker_(broker),
      repository_(broker.repository()),
      scenario_(scenario),
      naming_(naming),
      listener_(listener),
      random_(seed) {}

void ArrayChanger::change() {
    using Step = void (ArrayChanger::*)(Controller&);
    static constexpr Step kSteps[] = {
        &ArrayChanger::changeDriveStatus,  &ArrayChanger::changeDriveStatus,
        &ArrayChanger::removeDrive,        &ArrayChanger::insertDrive,
        &ArrayChanger::moveDrive,          &ArrayChanger::replaceDriveClass,
        &ArrayChanger::changeVolumeStatus, &ArrayChanger::resizeVolume,
        &ArrayChanger::renameVolume,       &ArrayChanger::createVolume,
        &ArrayChanger::deleteVolume,       &ArrayChanger::changeBattery,
        &ArrayChanger::swapBattery,        &ArrayChanger::changePort,
        &ArrayChanger::swapPort,           &ArrayChanger::createPool,
        &ArrayChanger::deletePool,         &ArrayChanger::resizePool,
        &ArrayChanger::failWalk,           &ArrayChanger::failExtent,
    };
    Controller& controller = scenario_.controllers[draw(2)];
    (this->*kSteps[draw(sizeof kSteps / sizeof kSteps[0])])(controller);
}

std::uint16_t ArrayChanger::status() {
    constexpr std::uint16_t kStatuses[] = {2, 3, 6, 12, 15};
    return kStatuses[draw(5)];
}

std::uint16_t ArrayChanger::extentStatus() {
    constexpr std::uint16_t kStatuses[] = {2, 3, 11, 13};
    return kStatuses[draw(4)];
}

/// One or two pools, now and then one that does not exist.
std::vector<std::string> ArrayChanger::somePools(const Controller& controller) {
    std::vector<std::string> ids;
    for (unsigned i = 0; i <= draw(2) && !controller.pools.empty(); i++)
        ids.push_back(controller.pools[draw(static_cast<unsigned>(controller.pools.size()))].id);
    if (ids.size() == 2 && ids[0] == ids[1]) ids.pop_back();
    return ids;
}

void ArrayChanger::changeDriveStatus(Controller& controller) {
    if (controller.drives.empty()) return;
    auto& drive = controller.drives[draw(static_cast<unsigned>(controller.drives.size()))];
    renew(repository_, naming_, controller, drive, driveGraph, [&](DriveDescription& changed) {
        changed.operationalStatus = status();
        changed.extentStatus = extentStatus();
    });
}

void ArrayChanger::removeDrive(Controller& controller) {
    if (controller.drives.empty()) return;
    drop(repository_, naming_, controller, controller.drives,
         draw(static_cast<unsigned>(controller.drives.size())), driveGraph);
}

void ArrayChanger::insertDrive(Controller& controller) {
    if (controller.drives.size() >= kMaxDrives) return;
    DriveDescription drive = makeDrive("d" + std::to_string(nextId_++), "");
    drive.pools = somePools(controller);
    drive.noMedia = draw(10) == 0;
    drive.noPackage = draw(10) == 0;
    if (draw(10) == 0) drive.firmware.reset();
    add(repository_, naming_, controller, controller.drives, drive, driveGraph);
}

void ArrayChanger::moveDrive(Controller& controller) {
    if (controller.drives.empty()) return;
    auto& drive = controller.drives[draw(static_cast<unsigned>(controller.drives.size()))];
    exchange(repository_, naming_, controller, drive, driveGraph,
             [&](DriveDescription& changed) { changed.pools = somePools(controller); });
}

void ArrayChanger::replaceDriveClass(Controller& controller) {
    if (controller.drives.empty()) return;
    auto& drive = controller.drives[draw(static_cast<unsigned>(controller.drives.size()))];
    exchange(repository_, naming_, controller, drive, driveGraph, [](DriveDescription& changed) {
        changed.interface = changed.interface == "SAS" ? "SATA" : "SAS";
    });
}

void ArrayChanger::changeVolumeStatus(Controller& controller) {
    if (controller.volumes.empty()) return;
    auto& volume = controller.volumes[draw(static_cast<unsigned>(controller.volumes.size()))];
    renew(repository_, naming_, controller, volume, volumeGraph, [&](VolumeDescription& changed) {
        changed.operationalStatus = status();
        changed.extentStatus = extentStatus();
    });
}

void ArrayChanger::resizeVolume(Controller& controller) {
    if (controller.volumes.empty()) return;
    auto& volume = controller.volumes[draw(static_cast<unsigned>(controller.volumes.size()))];
    renew(repository_, naming_, controller, volume, volumeGraph, [&](VolumeDescription& changed) {
        changed.blocks += draw(2) == 0 ? 1 : std::uint64_t{1} << 32;
        if (draw(2) == 0) changed.consumableBlocks = draw(1000);
    });
}

void ArrayChanger::renameVolume(Controller& controller) {
    if (controller.volumes.empty()) return;
    auto& volume = controller.volumes[draw(static_cast<unsigned>(controller.volumes.size()))];
    renew(repository_, naming_, controller, volume, volumeGraph, [&](VolumeDescription& changed) {
        changed.tweaks.properties.clear();
        changed.name = "name" + std::to_string(nextId_++);
        if (draw(4) == 0)
            changed.tweaks.properties = {{"ElementName", CimValue::null(CMPI_string)}};
    });
}

void ArrayChanger::createVolume(Controller& controller) {
    if (controller.volumes.size() >= kMaxOfAKind || controller.pools.empty()) return;
    VolumeDescription volume = makeVolume(std::to_string(nextId_++), "");
    volume.pools = {controller.pools[draw(static_cast<unsigned>(controller.pools.size()))].id};
    if (draw(4) == 0) volume.raidLevel.reset();
    add(repository_, naming_, controller, controller.volumes, volume, volumeGraph);
}

void ArrayChanger::deleteVolume(Controller& controller) {
    if (controller.volumes.empty()) return;
    drop(repository_, naming_, controller, controller.volumes,
         draw(static_cast<unsigned>(controller.volumes.size())), volumeGraph);
}

void ArrayChanger::changeBattery(Controller& controller) {
    if (controller.batteries.empty()) return;
    auto& battery = controller.batteries[draw(static_cast<unsigned>(controller.batteries.size()))];
    renew(repository_, naming_, controller, battery, batteryGraph,
          [&](BatteryDescription& changed) {
              changed.operationalStatus = status();
              changed.batteryStatus = static_cast<std::uint16_t>(draw(5));
          });
}

void ArrayChanger::swapBattery(Controller& controller) {
    if (!controller.batteries.empty())
        drop(repository_, naming_, controller, controller.batteries, 0, batteryGraph);
    if (controller.batteries.size() < kMaxOfAKind && draw(2) == 0)
        add(repository_, naming_, controller, controller.batteries,
            makeBattery(std::to_string(nextId_++)), batteryGraph);
}

void ArrayChanger::changePort(Controller& controller) {
    if (controller.ports.empty()) return;
    renew(repository_, naming_, controller, controller.ports[0], portGraph,
          [&](PortDescription& changed) { changed.operationalStatus = status(); });
}

void ArrayChanger::swapPort(Controller& controller) {
    if (!controller.ports.empty())
        drop(repository_, naming_, controller, controller.ports, 0, portGraph);
    if (controller.ports.size() < kMaxOfAKind)
        add(repository_, naming_, controller, controller.ports, makePort(std::to_string(nextId_++)),
            portGraph);
}

void ArrayChanger::createPool(Controller& controller) {
    if (controller.pools.size() >= kMaxOfAKind) return;
    add(repository_, naming_, controller, controller.pools,
        makePool("p" + std::to_string(nextId_++), false), poolGraph);
}

void ArrayChanger::deletePool(Controller& controller) {
    if (controller.pools.size() < 2) return;
    drop(repository_, naming_, controller, controller.pools,
         draw(static_cast<unsigned>(controller.pools.size())), poolGraph);
}

void ArrayChanger::resizePool(Controller& controller) {
    if (controller.pools.empty()) return;
    renew(repository_, naming_, controller, controller.pools[0], poolGraph,
          [&](PoolDescription& changed) { changed.total += 10; });
}

void ArrayChanger::failWalk(Controller&) {
    struct Walk {
        Kind kind;
        const char* assocClass;
        const char* resultClass;
    };
    constexpr Walk kWalks[] = {{Kind::Pool, "CIM_HostedStoragePool", "CIM_StoragePool"},
                               {Kind::Drive, "CIM_SystemDevice", "CIM_DiskDrive"},
                               {Kind::Volume, "CIM_SystemDevice", "CIM_StorageVolume"},
                               {Kind::Port, "CIM_SystemDevice", "CIM_SASSATAPort"},
                               {Kind::Battery, "CIM_SystemDevice", "CIM_Battery"}};
    const Walk& walk = kWalks[draw(5)];
    FaultRule rule;
    rule.entry = Entry::Associators;
    rule.assocClass = walk.assocClass;
    rule.resultClass = walk.resultClass;
    rule.times = 1;
    rule.rc = CMPI_RC_ERR_FAILED;
    broker_.faults().add(rule);
    listener_.failNextWalk(walk.kind);
}

void ArrayChanger::failExtent(Controller&) {
    FaultRule rule;
    rule.entry = Entry::GetInstance;
    rule.times = 1;
    rule.rc = CMPI_RC_ERR_FAILED;
    broker_.faults().add(rule);
    listener_.failNextExtent();
}

}  // namespace modeltest
