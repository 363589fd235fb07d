#include "vendor_fixture.h"

namespace testbed {
namespace {

using DeviceGraph = VendorTest;

TEST_F(DeviceGraph, SystemListsEveryDeviceOnce) {
    buildController(R"("drives": [{"id": "d"}], "volumes": [{"id": "v"}], "ports": [{"id": "p"}],
        "batteries": [{"id": "b"}], "others": [{"id": "f"}], "enclosures": [{"number": 1}],
        "pools": [{"id": "P"}])");
    EXPECT_EQ(walk(system(), "CIM_SystemDevice").size(), 5u);
}

TEST_F(DeviceGraph, Port) {
    buildController(R"("ports": [{"id": "3", "name": "Port three", "type": "SATA",
                                  "usage": "not restricted", "state": "down"}])");
    const Instance port = only(system(), "CIM_SystemDevice", "CIM_SASSATAPort");
    EXPECT_EQ(valueOf(port, "DeviceID"), "3");
    EXPECT_EQ(valueOf(port, "ElementName"), "Port three");
    EXPECT_EQ(valueOf(port, "PortType"), "93");
    EXPECT_EQ(valueOf(port, "UsageRestriction"), "4");
    EXPECT_EQ(typeOf(port, "UsageRestriction"), CMPI_uint16);
    EXPECT_EQ(valueOf(port, "OperationalStatus"), "[12]");
}

TEST_F(DeviceGraph, Battery) {
    buildController(R"("batteries": [{"id": "0", "state": "weak"}])");
    const Instance battery = only(system(), "CIM_SystemDevice", "CIM_Battery");
    EXPECT_EQ(valueOf(battery, "DeviceID"), "0");
    EXPECT_EQ(valueOf(battery, "BatteryStatus"), "4");
    EXPECT_EQ(typeOf(battery, "BatteryStatus"), CMPI_uint16);
    EXPECT_EQ(valueOf(battery, "OperationalStatus"), "[3]");
}

TEST_F(DeviceGraph, OtherDeviceIsNoneOfTheKnownKinds) {
    buildController(R"("others": [{"id": "a", "class": "Sample_Alarm", "status": "error"}])");
    const Instance alarm = only(system(), "CIM_SystemDevice");
    EXPECT_EQ(alarm.path.className, "Sample_Alarm");
    EXPECT_EQ(keyOf(alarm, "CreationClassName"), "Sample_Alarm");
    EXPECT_TRUE(repository.isA("root/sample", "Sample_Alarm", "CIM_LogicalDevice"));
    for (const char* kind :
         {"CIM_StorageVolume", "CIM_SASSATAPort", "CIM_DiskDrive", "CIM_Battery"})
        EXPECT_FALSE(repository.isA("root/sample", "Sample_Alarm", kind)) << kind;
    EXPECT_EQ(valueOf(alarm, "OperationalStatus"), "[6]");
}

TEST_F(DeviceGraph, DevicesAreNamedWithinTheirSystem) {
    buildController(R"("batteries": [{"id": "0"}])");
    const Instance battery = devices("CIM_Battery").at(0);
    EXPECT_EQ(keyOf(battery, "SystemName"), system().findKey("Name")->text());
    EXPECT_EQ(keyOf(battery, "SystemCreationClassName"), "Sample_ControllerSystem");
    EXPECT_EQ(keyOf(battery, "DeviceID"), "0");
}

TEST_F(DeviceGraph, RolesAreThoseOfTheSchema) {
    buildController(R"("batteries": [{"id": "0"}])");
    AssociationFilter filter;
    filter.assocClass = "CIM_SystemDevice";
    filter.role = "GroupComponent";
    filter.resultRole = "PartComponent";
    EXPECT_EQ(repository.associators(system(), filter).size(), 1u);
    filter.role = "PartComponent";
    EXPECT_TRUE(repository.associators(system(), filter).empty());
}

}  // namespace
}  // namespace testbed
