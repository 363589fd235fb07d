#include "vendor_fixture.h"

namespace testbed {
namespace {

using StorageGraph = VendorTest;

constexpr const char* kOneDrive = R"(
    "pools": [{"id": "P0", "totalBytes": 100, "remainingBytes": 40}, {"id": "P1"}],
    "enclosures": [{"number": 32, "status": "degraded"}, {"tag": "Shelf"}],
    "drives": [{"id": "d0", "name": "drive 0", "slot": 4, "enclosure": 32, "pools": ["P0", "P1"],
                "state": "rebuild", "firmware": "GS0F", "capacityBlocks": 5000000000,
                "consumableBlocks": 11}],
    "volumes": [{"id": "v0", "name": "data", "raid": "RAID5", "pool": "P1", "state": "degraded",
                 "uniqueName": "6005", "nameFormat": 9, "nameNameSpace": 2, "deltaReservation": 7,
                 "capacityBlocks": 6000000000, "consumableBlocks": 12, "primordial": true}])";

TEST_F(StorageGraph, PoolsAreHosted) {
    buildController(kOneDrive);
    const auto pools = walk(system(), "CIM_HostedStoragePool", "CIM_StoragePool");
    ASSERT_EQ(pools.size(), 2u);
    EXPECT_EQ(valueOf(pools[0], "PoolID"), "P0");
    EXPECT_EQ(keyOf(pools[0], "InstanceID"), valueOf(pools[0], "InstanceID"));
    EXPECT_EQ(valueOf(pools[0], "TotalManagedSpace"), "100");
    EXPECT_EQ(typeOf(pools[0], "RemainingManagedSpace"), CMPI_uint64);
    EXPECT_EQ(typeOf(pools[0], "Primordial"), CMPI_boolean);
    EXPECT_EQ(valueOf(pools[0], "OperationalStatus"), "[2]");
}

TEST_F(StorageGraph, PoolsOfTwoControllersDiffer) {
    build(R"({"controllers": [{"id": "C0", "pools": [{"id": "P"}]},
                              {"id": "C1", "pools": [{"id": "P"}]}]})");
    EXPECT_EQ(repository.enumerate("root/sample", "CIM_StoragePool").size(), 2u);
}

TEST_F(StorageGraph, EnclosuresArePackaged) {
    buildController(kOneDrive);
    const auto found = walk(system(), "CIM_SystemPackaging", "CIM_Chassis");
    ASSERT_EQ(found.size(), 2u);
    EXPECT_EQ(keyOf(found[0], "Tag"), "C0_32");
    EXPECT_EQ(valueOf(found[0], "Tag"), "C0_32");
    EXPECT_EQ(valueOf(found[0], "OperationalStatus"), "[3]");
    EXPECT_EQ(keyOf(found[1], "Tag"), "Shelf");
    EXPECT_NE(found[0].path.findKey("CreationClassName"), nullptr);
}

TEST_F(StorageGraph, DriveAndItsMedia) {
    buildController(kOneDrive);
    const Instance drive = only(system(), "CIM_SystemDevice", "CIM_DiskDrive");
    EXPECT_EQ(drive.path.className, "Sample_SASDrive");
    EXPECT_EQ(valueOf(drive, "DeviceID"), "d0");
    EXPECT_EQ(valueOf(drive, "Name"), "drive 0");
    EXPECT_EQ(typeOf(drive, "EnabledState"), CMPI_uint16);
    EXPECT_EQ(valueOf(drive, "OperationalStatus"), "[2]");
    const Instance extent = only(drive.path, "CIM_MediaPresent");
    EXPECT_EQ(valueOf(extent, "NumberOfBlocks"), "5000000000");
    EXPECT_EQ(valueOf(extent, "ConsumableBlocks"), "11");
    EXPECT_EQ(valueOf(extent, "Primordial"), "false");
    EXPECT_EQ(valueOf(extent, "ExtentStatus"), "[11]");
    EXPECT_TRUE(repository.isA("root/sample", extent.path.className, "CIM_StorageExtent"));
    const auto pools = walk(extent.path, "CIM_ConcreteComponent", "CIM_StoragePool");
    ASSERT_EQ(pools.size(), 2u);
    EXPECT_EQ(valueOf(pools[0], "PoolID"), "P0");
    EXPECT_EQ(valueOf(pools[1], "PoolID"), "P1");
}

TEST_F(StorageGraph, DriveFirmwareAndPlace) {
    buildController(kOneDrive);
    const ObjectPath drive = naming().drive(controller(), controller().drives[0]);
    EXPECT_EQ(valueOf(only(drive, "CIM_ElementSoftwareIdentity", "CIM_SoftwareIdentity"),
                      "VersionString"),
              "GS0F");
    const Instance package = only(drive, "CIM_Realizes", "CIM_PhysicalPackage");
    const Instance slot = only(package.path, "CIM_PackageInConnector", "CIM_Slot");
    EXPECT_EQ(valueOf(slot, "Number"), "4");
    EXPECT_EQ(typeOf(slot, "Number"), CMPI_uint16);
    EXPECT_EQ(keyOf(only(slot.path, "CIM_Container", "CIM_Chassis"), "Tag"), "C0_32");
}

TEST_F(StorageGraph, DriveInterfaceDecidesTheClass) {
    buildController(R"("drives": [{"id": "a", "interface": "SATA"}])");
    EXPECT_EQ(devices("CIM_DiskDrive").at(0).path.className, "Sample_SATADrive");
}

TEST_F(StorageGraph, DrivePartsCanBeMissing) {
    buildController(R"("pools": [{"id": "P"}], "enclosures": [{"number": 1}],
        "drives": [{"id": "media", "noMedia": true}, {"id": "package", "noPackage": true},
                   {"id": "slot", "noSlot": true, "slot": 1},
                   {"id": "enclosure", "noEnclosure": true, "slot": 2, "enclosure": 1},
                   {"id": "pool", "noPool": true}])");
    const auto path = [&](int i) { return naming().drive(controller(), controller().drives[i]); };
    EXPECT_EQ(devices("CIM_DiskDrive").size(), 5u);
    EXPECT_TRUE(walk(path(0), "CIM_MediaPresent").empty());
    EXPECT_TRUE(walk(path(0), "CIM_ElementSoftwareIdentity").empty());
    EXPECT_TRUE(walk(path(1), "CIM_Realizes").empty());
    EXPECT_TRUE(walk(only(path(2), "CIM_Realizes").path, "CIM_PackageInConnector").empty());
    const Instance slot = only(only(path(3), "CIM_Realizes").path, "CIM_PackageInConnector");
    EXPECT_TRUE(walk(slot.path, "CIM_Container").empty());
    EXPECT_TRUE(walk(only(path(4), "CIM_MediaPresent").path, "CIM_ConcreteComponent").empty());
}

TEST_F(StorageGraph, VolumeWithSettingAndPool) {
    buildController(kOneDrive);
    const Instance volume = only(system(), "CIM_SystemDevice", "CIM_StorageVolume");
    const std::map<std::string, std::string> expected = {{"DeviceID", "v0"},
                                                         {"ElementName", "data"},
                                                         {"Name", "6005"},
                                                         {"NameFormat", "9"},
                                                         {"NameNameSpace", "2"},
                                                         {"NumberOfBlocks", "6000000000"},
                                                         {"ConsumableBlocks", "12"},
                                                         {"DataRedundancy", "1"},
                                                         {"PackageRedundancy", "1"},
                                                         {"IsBasedOnUnderlyingRedundancy", "true"},
                                                         {"DeltaReservation", "7"},
                                                         {"Primordial", "true"},
                                                         {"OperationalStatus", "[3]"},
                                                         {"ExtentStatus", "[6]"}};
    for (const auto& [name, text] : expected) EXPECT_EQ(valueOf(volume, name.c_str()), text);
    EXPECT_EQ(typeOf(volume, "NameFormat"), CMPI_uint16);
    EXPECT_EQ(typeOf(volume, "DeltaReservation"), CMPI_uint8);
    EXPECT_EQ(typeOf(volume, "NumberOfBlocks"), CMPI_uint64);
    EXPECT_EQ(
        valueOf(only(volume.path, "CIM_ElementSettingData", "CIM_StorageSetting"), "ElementName"),
        "RAID5");
    EXPECT_EQ(
        valueOf(only(volume.path, "CIM_AllocatedFromStoragePool", "CIM_StoragePool"), "PoolID"),
        "P1");
}

TEST_F(StorageGraph, VolumeWithoutLevelAndPool) {
    buildController(R"("volumes": [{"id": "v0"}])");
    const Instance volume = devices("CIM_StorageVolume").at(0);
    EXPECT_TRUE(walk(volume.path, "CIM_ElementSettingData").empty());
    EXPECT_TRUE(walk(volume.path, "CIM_AllocatedFromStoragePool").empty());
}

}  // namespace
}  // namespace testbed
