// Every scenario that we ship can be read and built.
#include <algorithm>
#include <filesystem>

#include "vendor_fixture.h"

namespace testbed {
namespace {

std::vector<std::string> scenarioNames() {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(SCENARIO_DIR))
        if (entry.path().extension() == ".json") names.push_back(entry.path().stem().string());
    std::sort(names.begin(), names.end());
    return names;
}

Scenario shipped(const std::string& name) {
    return readScenario(std::string(SCENARIO_DIR) + "/" + name + ".json");
}

class ScenarioFile : public ::testing::TestWithParam<std::string> {};

TEST_P(ScenarioFile, BuildsEveryControllerAndDevice) {
    const Scenario scenario = shipped(GetParam());
    EXPECT_FALSE(scenario.description.empty());
    Repository repository;
    buildVendor(repository, scenario);
    std::size_t drives = 0, volumes = 0;
    for (const ControllerDescription& controller : scenario.controllers) {
        drives += controller.drives.size();
        volumes += controller.volumes.size();
    }
    const std::string& home = scenario.vendor.nameSpace;
    EXPECT_EQ(repository.enumerate(home, "CIM_PortController").size(), scenario.controllers.size());
    EXPECT_EQ(repository.enumerate(home, "CIM_DiskDrive").size(), drives);
    EXPECT_EQ(repository.enumerate(home, "CIM_StorageVolume").size(), volumes);
    EXPECT_EQ(repository.enumerate("root/cimv2", "OMC_UnitaryComputerSystem").size(), 1u);
}

INSTANTIATE_TEST_SUITE_P(Shipped, ScenarioFile, ::testing::ValuesIn(scenarioNames()),
                         [](const auto& test) {
                             std::string name = test.param;
                             std::replace(name.begin(), name.end(), '-', '_');
                             return name;
                         });

TEST(ScenarioFiles, AreWhatTheirNamesPromise) {
    EXPECT_EQ(shipped("two-controllers").controllers.size(), 2u);
    EXPECT_EQ(shipped("healthy-array").controllers.at(0).drives.size(), 8u);
    EXPECT_EQ(shipped("many-drives").controllers.at(0).drives.size(), 240u);
    EXPECT_EQ(shipped("many-drives").controllers.at(0).enclosures.size(), 10u);
    EXPECT_TRUE(shipped("no-pools").controllers.at(0).pools.empty());
    EXPECT_FALSE(shipped("hostile-vendor").faults.empty());
    const auto degraded = shipped("degraded-array").controllers.at(0);
    const auto drivesWith = [&](int status, int extent) {
        return std::count_if(degraded.drives.begin(), degraded.drives.end(), [&](const auto& d) {
            return d.operationalStatus == status && d.extentStatus == extent;
        });
    };
    EXPECT_EQ(drivesWith(6, 3), 1) << "failed";
    EXPECT_EQ(drivesWith(2, 11), 1) << "rebuilding";
    EXPECT_EQ(degraded.volumes.at(0).operationalStatus, 3);
    EXPECT_EQ(degraded.batteries.at(0).batteryStatus, 4);
}

TEST(ScenarioFiles, HostileVendorFailsAQueryOfEveryAssociation) {
    const Scenario scenario = shipped("hostile-vendor");
    for (const char* assocClass :
         {"CIM_ElementConformsToProfile", "CIM_LogicalIdentity", "CIM_Realizes",
          "CIM_ElementSoftwareIdentity", "CIM_HostedStoragePool", "CIM_SystemPackaging",
          "CIM_SystemDevice", "CIM_MediaPresent", "CIM_ConcreteComponent", "CIM_PackageInConnector",
          "CIM_Container", "CIM_ElementSettingData", "CIM_AllocatedFromStoragePool"})
        EXPECT_TRUE(std::any_of(
            scenario.faults.begin(), scenario.faults.end(),
            [&](const FaultRule& rule) { return rule.assocClass == std::string(assocClass); }))
            << assocClass;
}

}  // namespace
}  // namespace testbed
