// Reading pools, drives, volumes, enclosures, ports and batteries from a scenario.
#include "scenario_reading.h"

namespace testbed {
namespace {

constexpr std::uint64_t kBlockBytes = 512;

/// Reads `stem`+"Blocks" or `stem`+"GB" (a thousand million bytes); `absent` without either.
std::uint64_t readBlocks(JsonReader& reader, const std::string& stem, std::uint64_t absent) {
    constexpr std::uint64_t kBlocksPerGB = 1'000'000'000 / kBlockBytes;
    const auto blocks = reader.number(stem + "Blocks");
    const auto gigabytes = reader.number(stem + "GB", UINT64_MAX / kBlocksPerGB / kBlockBytes);
    if (blocks) return *blocks;
    return gigabytes ? *gigabytes * kBlocksPerGB : absent;
}

std::uint64_t readBytes(JsonReader& reader, const std::string& stem) {
    const auto bytes = reader.number(stem + "Bytes");
    return bytes ? *bytes : readBlocks(reader, stem, 0) * kBlockBytes;
}

/// Pools as listed, or the controller's only pool of the wanted kind.
std::vector<std::string> readPools(JsonReader& reader, const ControllerDescription& controller,
                                   bool primordial) {
    const bool named = reader.has("pool") || reader.has("pools");
    std::vector<std::string> pools = reader.texts("pool");
    for (std::string& pool : reader.texts("pools")) pools.push_back(std::move(pool));
    for (const std::string& pool : pools) {
        if (!findById(controller.pools, pool)) reader.fail("no pool \"" + pool + "\"");
    }
    if (reader.flag("noPool")) return {};
    if (named) return pools;
    for (const PoolDescription& pool : controller.pools) {
        if (pool.primordial == primordial) pools.push_back(pool.id);
    }
    if (pools.size() > 1) reader.fail("\"pool\" is missing and there is a choice");
    return pools;
}

void readDriveState(JsonReader& reader, DriveDescription& drive) {
    const StateWord* state = reader.state("state", driveStates());
    if (!state) state = findState(driveStates(), "online");
    drive.primordial = reader.flag("primordial", state->primordial);
    drive.operationalStatus = readStatus(reader, state->operationalStatus);
    drive.extentStatus = reader.code("extentStatus", extentStatusWords(), state->detail);
    drive.enabledState = reader.code("enabledState", enabledStateWords(), 2);
}

void readDriveLocation(JsonReader& reader, const ControllerDescription& controller,
                       DriveDescription& drive) {
    if (!reader.flag("noSlot") && reader.has("slot")) drive.slot = reader.number16("slot", 0);
    reader.take("slot");
    drive.enclosure = reader.text("enclosure", "");
    if (!drive.enclosure.empty() && !findById(controller.enclosures, drive.enclosure)) {
        reader.fail("no enclosure \"" + drive.enclosure + "\"");
    }
    if (reader.flag("noEnclosure")) drive.enclosure.clear();
    drive.noPackage = reader.flag("noPackage");
    drive.noMedia = reader.flag("noMedia");
}

/// NULL without the member.
const RaidLevel* readRaidLevel(JsonReader& reader) {
    const auto word = reader.optionalText("raid");
    if (!word) return nullptr;
    const RaidLevel* level = findRaidLevel(*word);
    if (!level) {
        reader.place().fail(
            "unknown RAID level \"" + *word + "\" (known: " + listOf(raidLevels()) + ")", "raid");
    }
    return level;
}

}  // namespace

std::uint16_t readStatus(JsonReader& reader, std::uint16_t absent) {
    if (reader.has("status") && reader.has("operationalStatus")) {
        reader.fail("\"status\" and \"operationalStatus\" are the same");
    }
    const std::uint16_t status = reader.code("status", operationalStatusWords(), absent);
    return reader.code("operationalStatus", operationalStatusWords(), status);
}

PoolDescription readPool(const JsonPlace& place, const ControllerDescription&) {
    JsonReader reader(place);
    PoolDescription pool;
    pool.id = reader.text("id");
    pool.primordial = reader.flag("primordial");
    pool.members = reader.texts("members");
    pool.total = readBytes(reader, "total");
    pool.remaining = readBytes(reader, "remaining");
    pool.operationalStatus = readStatus(reader);
    readTweaks(reader, pool, "CIM_StoragePool");
    reader.finish();
    return pool;
}

EnclosureDescription readEnclosure(const JsonPlace& place,
                                   const ControllerDescription& controller) {
    JsonReader reader(place);
    EnclosureDescription enclosure;
    enclosure.tag = reader.text("tag", "");
    enclosure.id = reader.text("number", enclosure.tag);
    if (enclosure.id.empty()) reader.fail("\"number\" or \"tag\" is missing");
    if (enclosure.tag.empty()) enclosure.tag = controller.id + "_" + enclosure.id;
    enclosure.operationalStatus = readStatus(reader);
    readTweaks(reader, enclosure, "CIM_Chassis");
    reader.finish();
    return enclosure;
}

DriveDescription readDrive(const JsonPlace& place, const ControllerDescription& controller) {
    JsonReader reader(place);
    DriveDescription drive;
    drive.id = reader.text("id");
    drive.name = reader.text("name", drive.id);
    drive.interface = reader.text("interface", "SAS");
    if (drive.interface != "SAS" && drive.interface != "SATA") {
        reader.fail("unknown interface \"" + drive.interface + "\" (known: SAS, SATA)");
    }
    readDriveState(reader, drive);
    readDriveLocation(reader, controller, drive);
    drive.pools = readPools(reader, controller, drive.primordial);
    drive.firmware = reader.optionalText("firmware");
    drive.blocks = readBlocks(reader, "capacity", 0);
    drive.consumableBlocks = readBlocks(reader, "consumable", drive.blocks);
    drive.spareFor = reader.text("spareFor", "");
    if (const StateWord* before = reader.state("before", driveStates())) {
        drive.before = before->word;
    }
    readTweaks(reader, drive, "CIM_DiskDrive",
               {{"extent", "CIM_StorageExtent"},
                {"package", "CIM_PhysicalPackage"},
                {"slotObject", "CIM_Slot"},
                {"software", "CIM_SoftwareIdentity"}});
    reader.finish();
    return drive;
}

VolumeDescription readVolume(const JsonPlace& place, const ControllerDescription& controller) {
    JsonReader reader(place);
    VolumeDescription volume;
    volume.id = reader.text("id");
    volume.name = reader.text("name", "");
    const RaidLevel* level = readRaidLevel(reader);
    if (level) volume.raidLevel = level->word;
    volume.dataRedundancy = reader.number16("dataRedundancy", level ? level->dataRedundancy : 1);
    volume.packageRedundancy =
        reader.number16("packageRedundancy", level ? level->packageRedundancy : 0);
    const StateWord* state = reader.state("state", volumeStates());
    if (!state) state = findState(volumeStates(), "optimal");
    volume.operationalStatus = readStatus(reader, state->operationalStatus);
    volume.extentStatus = reader.code("extentStatus", extentStatusWords(), state->detail);
    volume.primordial = reader.flag("primordial");
    volume.pools = readPools(reader, controller, false);
    volume.uniqueName = reader.text("uniqueName", controller.id + ":" + volume.id);
    volume.nameFormat = reader.number16("nameFormat", 1);
    volume.nameNameSpace = reader.number16("nameNameSpace", 1);
    volume.blocks = readBlocks(reader, "capacity", 0);
    volume.consumableBlocks = readBlocks(reader, "consumable", volume.blocks);
    volume.deltaReservation =
        static_cast<std::uint8_t>(reader.number("deltaReservation", UINT8_MAX).value_or(0));
    volume.basedOnUnderlyingRedundancy =
        reader.flag("basedOnUnderlyingRedundancy", volume.packageRedundancy > 0);
    readTweaks(reader, volume, "CIM_StorageVolume", {{"setting", "CIM_StorageSetting"}});
    reader.finish();
    return volume;
}

PortDescription readPort(const JsonPlace& place, const ControllerDescription&) {
    JsonReader reader(place);
    PortDescription port;
    port.id = reader.text("id");
    port.name = reader.text("name", "Port " + port.id);
    port.portType = reader.code("type", portTypeWords(), 94);
    port.usageRestriction = reader.code("usage", usageRestrictionWords(), 3);
    const StateWord* state = reader.state("state", portStates());
    port.operationalStatus = readStatus(reader, state ? state->operationalStatus : 2);
    readTweaks(reader, port, "CIM_SASSATAPort");
    reader.finish();
    return port;
}

BatteryDescription readBattery(const JsonPlace& place, const ControllerDescription&) {
    JsonReader reader(place);
    BatteryDescription battery;
    battery.id = reader.text("id");
    const StateWord* state = reader.state("state", batteryStates());
    if (!state) state = findState(batteryStates(), "optimal");
    battery.operationalStatus = readStatus(reader, state->operationalStatus);
    battery.batteryStatus = reader.code("batteryStatus", batteryStatusWords(), state->detail);
    readTweaks(reader, battery, "CIM_Battery");
    reader.finish();
    return battery;
}

OtherDescription readOther(const JsonPlace& place, const ControllerDescription&) {
    JsonReader reader(place);
    OtherDescription other;
    other.id = reader.text("id");
    other.name = reader.text("name", other.id);
    other.operationalStatus = readStatus(reader);
    readTweaks(reader, other, "CIM_LogicalDevice");
    reader.finish();
    return other;
}

}  // namespace testbed
