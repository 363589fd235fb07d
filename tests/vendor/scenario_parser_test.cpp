#include "scenario_parser.h"

#include <gtest/gtest.h>

namespace testbed {
namespace {

TEST(ScenarioParser, EmptyScenarioHasAHostAndTheUsualProfiles) {
    const Scenario scenario = parseScenario(R"({"controllers": []})", "x");
    EXPECT_EQ(scenario.host.id, "localhost.localdomain");
    EXPECT_EQ(scenario.vendor.nameSpace, "root/sample");
    EXPECT_TRUE(scenario.controllers.empty());
    ASSERT_EQ(scenario.profiles.size(), 3u);
    EXPECT_EQ(scenario.profiles[1].registeredName, "Host Hardware RAID Controller");
    EXPECT_FALSE(scenario.profiles[1].controllers.has_value());
}

TEST(ScenarioParser, RepetitionsNumberTexts) {
    const Scenario scenario = parseScenario(
        R"({"controllers": [{"id": "C0", "enclosures": [{"number": 8}],
            "drives": [{"id": "first"},
                       {"count": 3, "first": 4, "id": "8_{n}", "name": "d {n}/{n}", "slot": "{n}",
                        "enclosure": 8}],
            "ports": [{"count": 2, "id": "{n}"}]}]})",
        "x");
    const ControllerDescription& controller = scenario.controllers.at(0);
    ASSERT_EQ(controller.drives.size(), 4u);
    EXPECT_EQ(controller.drives[1].id, "8_4");
    EXPECT_EQ(controller.drives[3].id, "8_6");
    EXPECT_EQ(controller.drives[3].slot, 6);
    EXPECT_EQ(controller.drives[3].name, "d 6/6");
    ASSERT_EQ(controller.ports.size(), 2u);
    EXPECT_EQ(controller.ports[1].id, "1");
}

TEST(ScenarioParser, StateWordsChooseThePool) {
    const Scenario scenario = parseScenario(
        R"({"controllers": [{"id": "C0", "pools": [{"id": "free", "primordial": true}, {"id": "DG"}],
            "drives": [{"id": "a", "state": "online"}, {"id": "b", "state": "hot spare"},
                       {"id": "c", "state": "hot spare", "pool": "DG"},
                       {"id": "d", "noPool": true}]}]})",
        "x");
    const auto& drives = scenario.controllers.at(0).drives;
    EXPECT_EQ(drives[0].pools, std::vector<std::string>{"DG"});
    EXPECT_EQ(drives[1].pools, std::vector<std::string>{"free"});
    EXPECT_TRUE(drives[1].primordial);
    EXPECT_EQ(drives[2].pools, std::vector<std::string>{"DG"});
    EXPECT_TRUE(drives[3].pools.empty());
}

TEST(ScenarioParser, NumbersOverrideStateWords) {
    const Scenario scenario = parseScenario(
        R"({"controllers": [{"id": "C0", "drives": [{"id": "a", "state": "failed",
            "operationalStatus": 5, "extentStatus": 14, "primordial": true,
            "capacityBlocks": 7, "consumableBlocks": 3}]}]})",
        "x");
    const DriveDescription& drive = scenario.controllers.at(0).drives.at(0);
    EXPECT_EQ(drive.operationalStatus, 5);
    EXPECT_EQ(drive.extentStatus, 14);
    EXPECT_TRUE(drive.primordial);
    EXPECT_EQ(drive.blocks, 7u);
    EXPECT_EQ(drive.consumableBlocks, 3u);
}

TEST(ScenarioParser, CapacitiesInGigabytes) {
    const Scenario scenario = parseScenario(
        R"({"controllers": [{"id": "C0", "pools": [{"id": "P", "totalGB": 512, "remainingBytes": 9}],
            "volumes": [{"id": "v", "capacityGB": 2}]}]})",
        "x");
    EXPECT_EQ(scenario.controllers.at(0).volumes.at(0).blocks, 3906250u);
    EXPECT_EQ(scenario.controllers.at(0).pools.at(0).total, 512'000'000'000u);
    EXPECT_EQ(scenario.controllers.at(0).pools.at(0).remaining, 9u);
}

TEST(ScenarioParser, FaultsLatencyShuffleAndManager) {
    const Scenario scenario = parseScenario(
        R"({"controllers": [], "faults": [{"call": "associators", "assocClass": "CIM_Realizes", "resultClass": "X",
            "rc": 1, "message": "no", "delayMs": 20, "times": 2, "skip": 3, "keepResult": true},
            {"call": "classPathIsA", "pathContains": "C0", "nullResult": true}],
            "latencyMs": [1, 9], "shuffle": 7, "manager": {"serialQueries": true}})",
        "x");
    ASSERT_EQ(scenario.faults.size(), 2u);
    const FaultRule& rule = scenario.faults[0];
    EXPECT_EQ(rule.entry, Entry::Associators);
    EXPECT_EQ(rule.assocClass, "CIM_Realizes");
    EXPECT_EQ(rule.resultClass, "X");
    EXPECT_EQ(rule.rc, 1);
    EXPECT_EQ(rule.message, "no");
    EXPECT_EQ(rule.delay.count(), 20);
    EXPECT_EQ(rule.times, 2);
    EXPECT_EQ(rule.skip, 3);
    EXPECT_TRUE(rule.keepResult);
    EXPECT_EQ(scenario.faults[1].entry, Entry::ClassPathIsA);
    EXPECT_EQ(scenario.faults[1].times, -1);
    EXPECT_TRUE(scenario.faults[1].nullResult);
    EXPECT_EQ(scenario.latency.maximum.count(), 9);
    EXPECT_EQ(scenario.shuffle, 7u);
    EXPECT_TRUE(scenario.manager.serialQueries);
    EXPECT_FALSE(scenario.manager.allProperties);
}

TEST(ScenarioParser, ManagerByNameOrPieceByPiece) {
    EXPECT_EQ(parseScenario(R"({"controllers": []})", "x").manager.flush, FlushOffer::ContextEntry);
    const BrokerOptions named =
        parseScenario(R"({"controllers": [], "manager": "large"})", "x").manager;
    EXPECT_EQ(named.flush, FlushOffer::None);
    EXPECT_TRUE(named.strictProperties);
    const BrokerOptions pieces =
        parseScenario(
            R"({"controllers": [], "manager": {"kind": "large", "noKeys": false, "serialQueries": true,
                         "orderSeed": 9, "staticNamespaces": ["root/interop"],
                         "strictProperties": false}})",
            "x")
            .manager;
    EXPECT_TRUE(pieces.randomOrder);
    EXPECT_FALSE(pieces.instancesWithoutKeys);
    EXPECT_TRUE(pieces.serialQueries);
    EXPECT_EQ(pieces.orderSeed, 9u);
    EXPECT_EQ(pieces.staticNamespaces, std::vector<std::string>{"root/interop"});
    EXPECT_FALSE(pieces.strictProperties);
}

}  // namespace
}  // namespace testbed
