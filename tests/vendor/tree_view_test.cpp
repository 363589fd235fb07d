#include "tree_view.h"

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "inventory_changes.h"
#include "json_view.h"

namespace testbed {
namespace {

Instance served(const char* className, const char* key, const std::string& id,
                const std::string& elementName) {
    Instance instance;
    instance.path = {"root/cimv2", className, {}};
    instance.path.key(key, CimValue::string(id));
    instance.set("ElementName", CimValue::string(elementName));
    return instance;
}

Instance controller(const std::string& id) {
    Instance instance = served("Tovexa_PlexorController", "Name", "tvxController" + id,
                               "Controller " + id + " (M)");
    instance.set("HealthState", CimValue::uint16(5));
    instance.set("OperationalStatus", CimValue::uint16Array({3}));
    return instance;
}

ClassAnswer answer(const char* className, std::vector<Instance> instances) {
    ClassAnswer made{className, {}};
    made.response.instances = std::move(instances);
    return made;
}

TEST(TreeView, DevicesStandBeneathTheirController) {
    Instance battery =
        served("Tovexa_PlexorBattery", "DeviceID", "tvxControllerBatteryC1_0", "Battery 0");
    battery.set("HealthState", CimValue::uint16(30));
    battery.set("OperationalStatus", CimValue::uint16Array({6}));
    battery.set("BatteryStatus", CimValue::uint16(5));
    const Inventory inventory = {
        answer("Tovexa_PlexorController", {controller("C1"), controller("C12")}),
        answer("Tovexa_PlexorStorageVolume",
               {served("Tovexa_PlexorStorageVolume", "DeviceID", "tvxStorageVolumeC12_0", "v0"),
                served("Tovexa_PlexorStorageVolume", "DeviceID", "tvxStorageVolumeC1_1_2", "v1"),
                served("Tovexa_PlexorStorageVolume", "DeviceID", "tvxStorageVolumeC1_3", "v2")}),
        answer("Tovexa_PlexorBattery", {battery})};
    EXPECT_EQ(treeView(inventory),
              "Controller C1 (M)  [health ok, status degraded]\n"
              "├─ Volumes (2)\n"
              "│  ├─ v1\n"
              "│  └─ v2\n"
              "└─ Batteries (1)\n"
              "   └─ Battery 0  [health failed, status error, battery critical]\n"
              "Controller C12 (M)  [health ok, status degraded]\n"
              "└─ Volumes (1)\n"
              "   └─ v0\n");
}

TEST(TreeView, SoftwareShowsItsVersion) {
    Instance software = served("Tovexa_PlexorSoftwareIdentity", "InstanceID",
                               "tovexa:ControllerSoftwareC1", "Controller C1 (M)");
    software.set("VersionString", CimValue::string("4.2 (Package)"));
    const std::string text = treeView({answer("Tovexa_PlexorController", {controller("C1")}),
                                       answer("Tovexa_PlexorSoftwareIdentity", {software})});
    EXPECT_NE(text.find("└─ 4.2 (Package)\n"), std::string::npos) << text;
}

TEST(TreeView, StraysAndOddTextsDoNotBreakIt) {
    const std::string text = treeView(
        {answer("Tovexa_PlexorSASSATAPort",
                {served("Tovexa_PlexorSASSATAPort", "DeviceID", "tvxPortC9_0", "a\nb\x1b[31m")})});
    EXPECT_EQ(text, "Ports (1)\n└─ a?b?[31m\n");
    EXPECT_EQ(treeView({}), "nothing\n");
}

TEST(TreeView, UnknownCodesAreShownAsNumbers) {
    Instance odd = controller("C1");
    odd.set("HealthState", CimValue::uint16(77));
    const std::string text = treeView({answer("Tovexa_PlexorController", {odd})});
    EXPECT_NE(text.find("[health 77, status degraded]"), std::string::npos) << text;
}

TEST(TreeView, FoldsToTheTerminal) {
    const Inventory inventory = {
        answer("Tovexa_PlexorController", {controller("C1")}),
        answer(
            "Tovexa_PlexorBattery",
            {served("Tovexa_PlexorBattery", "DeviceID", "tvxControllerBatteryC1_0",
                    "Battery 0 of a controller"),
             served("Tovexa_PlexorBattery", "DeviceID", "tvxControllerBatteryC1_1", "b\xc3\xa4")})};
    EXPECT_EQ(treeView(inventory, {.columns = 24}),
              "Controller C1 (M)\n"
              "│    [health ok, status\n"
              "│    degraded]\n"
              "└─ Batteries (2)\n"
              "   ├─ Battery 0 of a\n"
              "   │    controller\n"
              "   └─ bä\n");
    EXPECT_EQ(treeView(inventory, {.ascii = true}),
              "Controller C1 (M)  [health ok, status degraded]\n"
              "`- Batteries (2)\n"
              "   |- Battery 0 of a controller\n"
              "   `- b?\n");
}

TEST(ChangeLines, NameWhatChanged) {
    Instance before = controller("C1"), after = before;
    after.set("HealthState", CimValue::uint16(30));
    EXPECT_EQ(changeLines({answer("Tovexa_PlexorController", {before})},
                          {answer("Tovexa_PlexorController", {after})}),
              std::vector<std::string>{"~ Controller C1 (M): HealthState 5 -> 30"});
}

TEST(JsonView, ListsInstancesByClass) {
    Instance one = controller("C\xff");
    one.set("Nothing", CimValue::null(CMPI_string));
    const auto document = nlohmann::json::parse(
        jsonView({answer("Tovexa_PlexorController", {one}), answer("Tovexa_PlexorBattery", {})}));
    EXPECT_TRUE(document.at("Tovexa_PlexorBattery").empty());
    const auto& object = document.at("Tovexa_PlexorController").at(0);
    EXPECT_EQ(object.at("properties").at("OperationalStatus"), nlohmann::json::array({3}));
    EXPECT_EQ(object.at("properties").at("HealthState"), 5);
    EXPECT_TRUE(object.at("properties").at("Nothing").is_null());
    EXPECT_EQ(object.at("keys").at("Name"), "tvxControllerC\xef\xbf\xbd");
    EXPECT_TRUE(object.at("path").is_string());
}

}  // namespace
}  // namespace testbed
