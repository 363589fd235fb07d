#include "vendor_fixture.h"

namespace testbed {
namespace {

using ProfileGraph = VendorTest;

TEST_F(ProfileGraph, HostIsOneComputerSystem) {
    build(R"({"host": {"name": "uuid-1", "elementName": "host-1"}, "controllers": []})");
    const auto hosts = repository.enumerate("root/cimv2", "OMC_UnitaryComputerSystem");
    ASSERT_EQ(hosts.size(), 1u);
    EXPECT_EQ(valueOf(hosts[0], "Name"), "uuid-1");
    EXPECT_EQ(valueOf(hosts[0], "ElementName"), "host-1");
    EXPECT_EQ(valueOf(hosts[0], "CreationClassName"), "OMC_UnitaryComputerSystem");
    EXPECT_TRUE(repository.isA("root/cimv2", "OMC_UnitaryComputerSystem", "CIM_ComputerSystem"));
}

TEST_F(ProfileGraph, HostCanBeAbsent) {
    build(R"({"host": {"absent": true}, "controllers": []})");
    EXPECT_TRUE(repository.hasClass("root/cimv2", "OMC_UnitaryComputerSystem"));
    EXPECT_TRUE(repository.enumerate("root/cimv2", "OMC_UnitaryComputerSystem").empty());
}

TEST_F(ProfileGraph, RegisteredProfileLeadsToTheControllers) {
    build(R"({"controllers": [{"id": "C0"}, {"id": "C1"}]})");
    const auto profiles = repository.enumerate("root/interop", "CIM_RegisteredProfile");
    ASSERT_EQ(profiles.size(), 3u);
    EXPECT_EQ(profiles[1].path.className, "Sample_RegisteredProfile");
    EXPECT_EQ(valueOf(profiles[1], "RegisteredName"), "Host Hardware RAID Controller");
    EXPECT_EQ(typeOf(profiles[1], "RegisteredOrganization"), CMPI_uint16);
    EXPECT_EQ(typeOf(profiles[1], "RegisteredVersion"), CMPI_string);
    const auto found = walk(profiles[1].path, "CIM_ElementConformsToProfile", "CIM_PortController");
    ASSERT_EQ(found.size(), 2u);
    EXPECT_EQ(found[0].path.nameSpace, "root/sample");
    EXPECT_EQ(found[0].path.className, "Sample_PortController");
    EXPECT_EQ(valueOf(found[1], "DeviceID"), "C1");
    EXPECT_TRUE(walk(profiles[0].path, "CIM_ElementConformsToProfile").empty());
}

TEST_F(ProfileGraph, ProfilesCanChooseControllers) {
    build(R"({"profiles": [{"name": "A", "version": "2.0.0", "organization": 2},
                           {"name": "B", "controllers": ["C1"]}, {"name": "C", "controllers": []}],
              "controllers": [{"id": "C0"}, {"id": "C1"}]})");
    const auto profiles = repository.enumerate("root/interop", "CIM_RegisteredProfile");
    ASSERT_EQ(profiles.size(), 3u);
    EXPECT_EQ(valueOf(profiles[0], "RegisteredVersion"), "2.0.0");
    EXPECT_EQ(valueOf(profiles[0], "RegisteredOrganization"), "2");
    EXPECT_EQ(walk(profiles[0].path, "CIM_ElementConformsToProfile").size(), 2u);
    EXPECT_EQ(valueOf(only(profiles[1].path, "CIM_ElementConformsToProfile"), "DeviceID"), "C1");
    EXPECT_TRUE(walk(profiles[2].path, "CIM_ElementConformsToProfile").empty());
}

TEST_F(ProfileGraph, VendorNamespaceAndPrefix) {
    build(R"({"vendor": {"namespace": "root/acme", "classPrefix": "Acme"},
              "controllers": [{"id": "C0"}]})");
    const auto found = repository.enumerate("root/acme", "CIM_PortController");
    ASSERT_EQ(found.size(), 1u);
    EXPECT_EQ(found[0].path.className, "Acme_PortController");
    EXPECT_FALSE(repository.hasNamespace("root/sample"));
    EXPECT_TRUE(repository.isA("root/acme", "Acme_Enclosure", "CIM_PhysicalPackage"));
    EXPECT_TRUE(repository.isA("root/acme", "Acme_StorageVolume", "CIM_StorageExtent"));
    EXPECT_FALSE(repository.isA("root/acme", "Acme_SASDrive", "CIM_StorageVolume"));
}

TEST_F(ProfileGraph, PortControllerIsASystemAndACard) {
    buildController(R"("health": "degraded", "status": "error")");
    const Instance system = only(portController(), "CIM_LogicalIdentity", "CIM_ComputerSystem");
    EXPECT_EQ(system.path, this->system());
    EXPECT_EQ(valueOf(system, "OperationalStatus"), "[6]");
    EXPECT_EQ(typeOf(system, "OperationalStatus"), CMPI_uint16A);
    const Instance card = only(portController(), "CIM_Realizes", "CIM_PhysicalPackage");
    EXPECT_EQ(valueOf(card, "Model"), "M1");
    EXPECT_EQ(valueOf(card, "HealthState"), "10");
    EXPECT_EQ(typeOf(card, "HealthState"), CMPI_uint16);
    for (const char* key :
         {"SystemCreationClassName", "SystemName", "CreationClassName", "DeviceID"})
        EXPECT_NE(portController().findKey(key), nullptr) << key;
}

TEST_F(ProfileGraph, ControllerPartsCanBeMissing) {
    buildController(R"("noSystem": true, "noPackage": true)");
    EXPECT_TRUE(walk(portController(), "CIM_LogicalIdentity").empty());
    EXPECT_TRUE(walk(portController(), "CIM_Realizes").empty());
    EXPECT_EQ(repository.enumerate("root/sample", "CIM_PortController").size(), 1u);
}

TEST_F(ProfileGraph, SoftwareHangsOffTheSystem) {
    buildController(R"("software": {"firmware": "1", "bios": "2", "driver": "3", "package": "4"})");
    const auto found = walk(system(), "CIM_ElementSoftwareIdentity", "CIM_SoftwareIdentity");
    std::map<std::string, std::string> versions;
    for (const Instance& instance : found)
        versions[valueOf(instance, "Classifications")] = valueOf(instance, "VersionString");
    const std::map<std::string, std::string> expected = {
        {"[10]", "1"}, {"[11]", "2"}, {"[2]", "3"}, {"[13]", "4"}};
    EXPECT_EQ(versions, expected);
    EXPECT_TRUE(walk(portController(), "CIM_ElementSoftwareIdentity").empty());
}

TEST_F(ProfileGraph, SoftwareListKeepsItsOrder) {
    buildController(R"("software": [{"id": "a", "classifications": [10, 11], "version": "1"},
                                    {"id": "b", "classifications": [], "version": "2"}])");
    const auto found = walk(system(), "CIM_ElementSoftwareIdentity");
    ASSERT_EQ(found.size(), 2u);
    EXPECT_EQ(valueOf(found[0], "Classifications"), "[10, 11]");
    EXPECT_EQ(typeOf(found[1], "Classifications"), CMPI_uint16A);
    EXPECT_EQ(found[1].find("Classifications")->asUnsigned(), 0u);
}

}  // namespace
}  // namespace testbed
