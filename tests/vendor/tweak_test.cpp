#include "vendor_fixture.h"

namespace testbed {
namespace {

class Tweak : public VendorTest {
protected:
    /// A controller with one drive that has these further members.
    Instance drive(const std::string& members) {
        buildController(R"("drives": [{"id": "d", )" + members + "}]");
        return devices("CIM_DiskDrive").at(0);
    }
};

TEST_F(Tweak, PlainValuesTakeTheDeclaredType) {
    const Instance made = drive(R"("properties": {"EnabledState": 6, "OperationalStatus": [5, 6],
                                   "Name": "x", "HealthState": 30})");
    EXPECT_EQ(typeOf(made, "EnabledState"), CMPI_uint16);
    EXPECT_EQ(valueOf(made, "EnabledState"), "6");
    EXPECT_EQ(typeOf(made, "OperationalStatus"), CMPI_uint16A);
    EXPECT_EQ(made.find("OperationalStatus")->asUnsigned(), 5u);
    EXPECT_EQ(typeOf(made, "HealthState"), CMPI_uint16);
}

TEST_F(Tweak, NullTakesTheDeclaredType) {
    const Instance made = drive(R"("properties": {"Name": null, "OperationalStatus": null})");
    EXPECT_EQ(*made.find("Name"), CimValue::null(CMPI_string));
    EXPECT_EQ(*made.find("OperationalStatus"), CimValue::null(CMPI_uint16A));
}

TEST_F(Tweak, ExplicitTypesNeedNotFitTheClass) {
    const Instance made = drive(
        R"("properties": {"OperationalStatus": {"type": "uint16", "value": 3},
                          "Name": {"type": "sint32", "value": -5},
                          "EnabledState": {"null": true, "type": "string"},
                          "Labels": {"type": "string[]", "value": ["a", null]}})");
    EXPECT_EQ(*made.find("OperationalStatus"), CimValue::uint16(3));
    EXPECT_EQ(*made.find("Name"), CimValue::signedInteger(CMPI_sint32, -5));
    EXPECT_EQ(*made.find("EnabledState"), CimValue::null(CMPI_string));
    EXPECT_EQ(*made.find("Labels"),
              CimValue::array(CMPI_string, {CimValue::string("a"), CimValue::null(CMPI_string)}));
}

TEST_F(Tweak, UndeclaredPropertiesTakeTheTypeOfTheirValue) {
    const Instance made = drive(
        R"("properties": {"A": "t", "B": 7, "C": -7, "D": true, "E": 0.5, "F": ["x"], "G": [1]})");
    EXPECT_EQ(typeOf(made, "A"), CMPI_string);
    EXPECT_EQ(typeOf(made, "B"), CMPI_uint64);
    EXPECT_EQ(typeOf(made, "C"), CMPI_sint64);
    EXPECT_EQ(typeOf(made, "D"), CMPI_boolean);
    EXPECT_EQ(typeOf(made, "E"), CMPI_real64);
    EXPECT_EQ(typeOf(made, "F"), CMPI_stringA);
    EXPECT_EQ(typeOf(made, "G"), CMPI_uint64A);
}

TEST_F(Tweak, OmittedPropertyIsAbsentButStaysAKey) {
    const Instance made = drive(R"("omit": ["DeviceID", "Name"])");
    EXPECT_EQ(valueOf(made, "DeviceID"), "<absent>");
    EXPECT_EQ(valueOf(made, "Name"), "<absent>");
    EXPECT_EQ(keyOf(made, "DeviceID"), "d");
}

TEST_F(Tweak, KeysCanBeReplacedAndLeftOut) {
    const Instance made = drive(R"("keys": {"DeviceID": {"type": "uint32", "value": 9}},
                                   "omitKeys": ["SystemName"])");
    EXPECT_EQ(*made.path.findKey("DeviceID"), CimValue::uint32(9));
    EXPECT_EQ(made.path.findKey("SystemName"), nullptr);
    EXPECT_EQ(walk(made.path, "CIM_MediaPresent").size(), 1u) << "still found by its path";
}

TEST_F(Tweak, ClassNameIsDefinedBelowTheKind) {
    const Instance made = drive(R"("class": "Sample_Nvme")");
    EXPECT_EQ(made.path.className, "Sample_Nvme");
    EXPECT_TRUE(repository.isA("root/sample", "Sample_Nvme", "CIM_DiskDrive"));
}

TEST_F(Tweak, PartsHaveTweaksOfTheirOwn) {
    const Instance made = drive(R"("slot": 1, "firmware": "F",
                 "extent": {"omit": ["NumberOfBlocks"], "properties": {"ExtentStatus": []}},
                 "software": {"properties": {"VersionString": null}},
                 "slotObject": {"properties": {"Number": 77}})");
    const Instance extent = only(made.path, "CIM_MediaPresent");
    EXPECT_EQ(valueOf(extent, "NumberOfBlocks"), "<absent>");
    EXPECT_EQ(*extent.find("ExtentStatus"), CimValue::array(CMPI_uint16, {}));
    EXPECT_EQ(*only(made.path, "CIM_ElementSoftwareIdentity").find("VersionString"),
              CimValue::null(CMPI_string));
    const Instance package = only(made.path, "CIM_Realizes");
    EXPECT_EQ(valueOf(only(package.path, "CIM_PackageInConnector"), "Number"), "77");
}

}  // namespace
}  // namespace testbed
