#include "cim_object.h"

#include <gtest/gtest.h>

namespace testbed {
namespace {

ObjectPath drive(const std::string& id) {
    return ObjectPath{"root/sample", "CIM_Drive", {}}.key("DeviceID", CimValue::string(id));
}

TEST(Names, CompareWithoutCase) {
    EXPECT_TRUE(sameName("CIM_Drive", "cim_DRIVE"));
    EXPECT_FALSE(sameName("CIM_Drive", "CIM_Drives"));
    EXPECT_FALSE(sameName("", "a"));
    EXPECT_EQ(foldName("OperationalStatus"), "operationalstatus");
}

TEST(CimValueTest, TextIsWhatPeopleRead) {
    EXPECT_EQ(CimValue::string("RAID5").text(), "RAID5");
    EXPECT_EQ(CimValue::uint16Array({2, 10}).text(), "[2, 10]");
    EXPECT_EQ(CimValue::boolean(true).text(), "true");
    EXPECT_EQ(CimValue::signedInteger(CMPI_sint32, -3).text(), "-3");
    EXPECT_EQ(CimValue::real64(0.5).text(), "0.5");
    EXPECT_EQ(CimValue::null(CMPI_uint16).text(), "<null>");
    EXPECT_EQ(CimValue::reference(drive("1")).text(), "root/sample:CIM_Drive.DeviceID=\"1\"");
}

TEST(CimValueTest, ReadersOfOtherTypesGetNothing) {
    EXPECT_EQ(CimValue::string("5").asUnsigned(), 0u);
    EXPECT_EQ(CimValue::uint16(5).asString(), "");
    EXPECT_EQ(CimValue::uint16Array({7, 8}).asUnsigned(), 7u);
    EXPECT_EQ(CimValue::uint16Array({}).asUnsigned(), 0u);
    EXPECT_EQ(CimValue::boolean(true).asUnsigned(), 1u);
    EXPECT_EQ(CimValue::null(CMPI_uint32).asUnsigned(), 0u);
}

TEST(CimValueTest, TextsHaveOneType) {
    EXPECT_EQ(CimValue::null(CMPI_chars).type, CMPI_string);
    EXPECT_EQ(CimValue::array(CMPI_chars, {}).type, CMPI_stringA);
}

TEST(CimValueTest, EqualityLooksAtTypeNullAndContent) {
    EXPECT_EQ(CimValue::uint16(3), CimValue::uint16(3));
    EXPECT_NE(CimValue::uint16(3), CimValue::uint32(3));
    EXPECT_NE(CimValue::uint16(0), CimValue::null(CMPI_uint16));
    EXPECT_EQ(CimValue::reference(drive("1")), CimValue::reference(drive("1")));
    EXPECT_NE(CimValue::reference(drive("1")), CimValue::reference(drive("2")));
}

TEST(CimValueTest, TypeNames) {
    EXPECT_EQ(typeName(CMPI_uint16), "uint16");
    EXPECT_EQ(typeName(CMPI_stringA), "string[]");
    EXPECT_EQ(typeName(0x0071), "type 0x0071");
}

TEST(ObjectPathTest, EqualInAnyKeyOrderAndCase) {
    ObjectPath left{"root/sample", "CIM_Drive", {}};
    left.key("Name", CimValue::string("a")).key("Slot", CimValue::uint16(3));
    ObjectPath right{"ROOT/sample", "cim_drive", {}};
    right.key("SLOT", CimValue::signedInteger(CMPI_sint64, 3)).key("name", CimValue::string("a"));
    EXPECT_EQ(left, right);
    EXPECT_EQ(left.identity(), right.identity());
}

TEST(ObjectPathTest, DiffersInValueKindAndMissingKey) {
    const ObjectPath path = drive("3");
    EXPECT_NE(path, drive("4"));
    EXPECT_NE(path, (ObjectPath{"root/sample", "CIM_Drive", {}}));
    EXPECT_NE(path,
              (ObjectPath{"root/sample", "CIM_Drive", {}}.key("DeviceID", CimValue::uint16(3))));
    EXPECT_NE(path, drive("A").key("DeviceID", CimValue::string("a")));
}

TEST(ObjectPathTest, QuotesCannotImitateAnotherPath) {
    ObjectPath two{"n", "C", {}};
    two.key("a", CimValue::string("1")).key("b", CimValue::string("2"));
    const ObjectPath one = ObjectPath{"n", "C", {}}.key("a", CimValue::string("1\",b=\"2"));
    EXPECT_NE(one.identity(), two.identity());
}

TEST(InstanceTest, PropertiesByNameWithoutCase) {
    Instance instance;
    instance.set("Status", CimValue::uint16(2)).set("STATUS", CimValue::uint16(3));
    ASSERT_EQ(instance.properties.size(), 1u);
    EXPECT_EQ(instance.find("status")->asUnsigned(), 3u);
    instance.erase("sTaTus");
    EXPECT_EQ(instance.find("Status"), nullptr);
}

}  // namespace
}  // namespace testbed
