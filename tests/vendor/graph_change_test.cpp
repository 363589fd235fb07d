// Changing the array while it runs: things appear, change and disappear one by one.
#include "vendor_fixture.h"

namespace testbed {
namespace {

class GraphChange : public VendorTest {
protected:
    void SetUp() override {
        buildController(R"("pools": [{"id": "P"}], "enclosures": [{"number": 1}],
            "drives": [{"id": "a", "slot": 0, "enclosure": 1, "firmware": "1"},
                       {"id": "b", "slot": 1, "enclosure": 1}],
            "volumes": [{"id": "v", "raid": "RAID1"}], "batteries": [{"id": "0"}])");
    }
};

TEST_F(GraphChange, WithdrawnDriveLeavesNothingBehind) {
    const Naming names = naming();
    const DriveDescription drive = controller().drives[0];
    driveGraph(names, controller(), drive).withdraw(repository);
    ASSERT_EQ(devices("CIM_DiskDrive").size(), 1u);
    EXPECT_EQ(valueOf(devices("CIM_DiskDrive")[0], "DeviceID"), "b");
    EXPECT_FALSE(repository.get(names.driveExtent(controller(), drive)));
    EXPECT_FALSE(repository.get(names.driveFirmware(controller(), drive)));
    EXPECT_FALSE(repository.get(names.drivePackage(controller(), drive)));
    EXPECT_TRUE(repository.references(names.drive(controller(), drive), "", "").empty());
}

TEST_F(GraphChange, DriveThatComesBackIsListedOnce) {
    const Naming names = naming();
    const ObjectGraph graph = driveGraph(names, controller(), controller().drives[0]);
    graph.withdraw(repository);
    graph.place(repository);
    EXPECT_EQ(devices("CIM_DiskDrive").size(), 2u);
    const ObjectPath path = names.drive(controller(), controller().drives[0]);
    EXPECT_EQ(repository.references(path, "CIM_SystemDevice", "").size(), 1u);
    EXPECT_EQ(repository.references(path, "CIM_MediaPresent", "").size(), 1u);
}

TEST_F(GraphChange, RenewedDriveKeepsItsAssociations) {
    const Naming names = naming();
    DriveDescription drive = controller().drives[0];
    drive.operationalStatus = 6;
    drive.extentStatus = 3;
    driveGraph(names, controller(), drive).renew(repository);
    EXPECT_EQ(devices("CIM_DiskDrive").size(), 2u);
    const ObjectPath path = names.drive(controller(), drive);
    EXPECT_EQ(valueOf(*repository.get(path), "OperationalStatus"), "[6]");
    EXPECT_EQ(valueOf(only(path, "CIM_MediaPresent"), "ExtentStatus"), "[3]");
    EXPECT_EQ(repository.references(path, "CIM_SystemDevice", "").size(), 1u);
}

TEST_F(GraphChange, NewBatteryAppears) {
    const Naming names = naming();
    BatteryDescription battery;
    battery.id = "1";
    batteryGraph(names, controller(), battery).place(repository);
    EXPECT_EQ(devices("CIM_Battery").size(), 2u);
}

TEST_F(GraphChange, WithdrawnControllerTakesItsDevicesAlong) {
    withdrawController(repository, naming(), controller());
    EXPECT_TRUE(repository.enumerate("root/sample", "CIM_ManagedElement").empty());
    EXPECT_FALSE(repository.enumerate("root/interop", "CIM_RegisteredProfile").empty());
    placeController(repository, naming(), controller());
    EXPECT_EQ(walk(system(), "CIM_SystemDevice").size(), 4u);
}

}  // namespace
}  // namespace testbed
