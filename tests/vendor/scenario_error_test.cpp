#include <gtest/gtest.h>

#include <string>

#include "scenario_parser.h"

namespace testbed {
namespace {

std::string errorOf(const std::string& text) {
    try {
        parseScenario(text, "x.json");
    } catch (const ScenarioError& error) {
        return error.what();
    }
    return "no error";
}

std::string errorIn(const std::string& controllerMembers) {
    return errorOf(R"({"controllers": [{"id": "C0", )" + controllerMembers + "}]}");
}

TEST(ScenarioError, BrokenJsonNamesLineAndColumn) {
    EXPECT_EQ(errorOf("{\n  \"host\": oops}"), "x.json: line 2, column 11: not valid JSON");
    EXPECT_EQ(errorOf(""), "x.json: line 1, column 1: not valid JSON");
}

TEST(ScenarioError, UnknownMembersAreRefusedEverywhere) {
    EXPECT_EQ(errorOf(R"({"hots": {}})"), "x.json: unknown member \"hots\"");
    EXPECT_EQ(errorOf(R"({"host": {"nmae": "a"}})"), "x.json: host: unknown member \"nmae\"");
    EXPECT_EQ(errorIn(R"("fans": [])"), "x.json: controllers[0]: unknown member \"fans\"");
    EXPECT_EQ(errorIn(R"("drives": [{"id": "d", "sloth": 1}])"),
              "x.json: controllers[0].drives[0]: unknown member \"sloth\"");
    EXPECT_EQ(errorIn(R"("drives": [{"id": "d", "extent": {"status": 1}}])"),
              "x.json: controllers[0].drives[0].extent: unknown member \"status\"");
}

TEST(ScenarioError, UnknownStatesListTheKnownOnes) {
    EXPECT_EQ(errorIn(R"("drives": [{"id": "a"}, {"id": "b", "state": "foo"}])"),
              "x.json: controllers[0].drives[1]: unknown state \"foo\" (known: online, hot spare, "
              "failed, rebuild, unconfigured good, unconfigured bad, offline, dormant)");
    EXPECT_NE(errorIn(R"("volumes": [{"id": "a", "state": "well"}])").find("(known: optimal,"),
              std::string::npos);
    EXPECT_NE(errorIn(R"("status": "well")").find("controllers[0].status: unknown word \"well\""),
              std::string::npos);
    EXPECT_NE(errorIn(R"("software": {"toast": "1"})").find("unknown software \"toast\""),
              std::string::npos);
}

TEST(ScenarioError, ReferencesMustLeadSomewhere) {
    EXPECT_EQ(errorIn(R"("drives": [{"id": "d", "pool": "P9"}])"),
              "x.json: controllers[0].drives[0]: no pool \"P9\"");
    EXPECT_EQ(errorIn(R"("drives": [{"id": "d", "enclosure": 7}])"),
              "x.json: controllers[0].drives[0]: no enclosure \"7\"");
    EXPECT_EQ(errorIn(R"("pools": [{"id": "A"}, {"id": "B"}], "drives": [{"id": "d"}])"),
              "x.json: controllers[0].drives[0]: \"pool\" is missing and there is a choice");
    EXPECT_EQ(errorOf(R"({"profiles": [{"name": "a", "controllers": ["C7"]}]})"),
              "x.json: profiles[0]: no controller \"C7\"");
}

TEST(ScenarioError, IdsMustDiffer) {
    EXPECT_EQ(errorIn(R"("drives": [{"id": "d"}, {"id": "d"}])"),
              "x.json: controllers[0].drives[1]: second \"d\"");
    EXPECT_EQ(errorIn(R"("ports": [{"id": "p", "count": 2}])"),
              "x.json: controllers[0].ports[1]: second \"p\"");
    EXPECT_EQ(errorOf(R"({"controllers": [{"id": "C0"}, {"id": "C0"}]})"),
              "x.json: controllers[1]: second controller \"C0\"");
    EXPECT_EQ(errorIn(R"("drives": [{"name": "x"}])"),
              "x.json: controllers[0].drives[0]: \"id\" is missing");
}

TEST(ScenarioError, TypesAndRangesAreChecked) {
    EXPECT_EQ(errorIn(R"("drives": 3)"), "x.json: controllers[0].drives: a list is needed here");
    EXPECT_EQ(errorIn(R"("drives": [3])"),
              "x.json: controllers[0].drives[0]: an object is needed here");
    EXPECT_EQ(errorIn(R"("model": true)"), "x.json: controllers[0].model: a text is needed here");
    EXPECT_EQ(errorIn(R"("noSystem": 1)"),
              "x.json: controllers[0].noSystem: true or false is needed here");
    const std::string range = ": a whole number from 0 to 65535 is needed here";
    for (const char* slot : {"65536", "-1", "1.5", "\"1a\"", "\"\"", "null"})
        EXPECT_EQ(errorIn(R"("drives": [{"id": "d", "slot": )" + std::string(slot) + "}]"),
                  "x.json: controllers[0].drives[0].slot" + range)
            << slot;
}

TEST(ScenarioError, RepetitionsAreCounted) {
    EXPECT_EQ(errorIn(R"("ports": [{"id": "p{n}", "count": "many"}])"),
              "x.json: controllers[0].ports[0].count: a whole number from 0 to 100000 is needed "
              "here");
    EXPECT_EQ(errorIn(R"("ports": [{"id": "p{n}", "count": 1, "first": -1}])"),
              "x.json: controllers[0].ports[0].first: a whole number from 0 to 4294967295 is "
              "needed here");
}

TEST(ScenarioError, OverridesMustFitTheirType) {
    const auto errorWith = [](const std::string& value) {
        return errorIn(R"("properties": {"HealthState": )" + value + "}");
    };
    const std::string place = "x.json: controllers[0].properties.HealthState";
    EXPECT_EQ(errorWith("70000"), place + ": a whole number from 0 to 65535 is needed here");
    EXPECT_EQ(errorWith(R"({"type": "uint17", "value": 1})"), place + ": unknown type \"uint17\"");
    EXPECT_EQ(errorWith(R"({"type": "uint16"})"), place + ": \"value\" is missing");
    EXPECT_EQ(errorWith(R"({"type": "sint8", "value": -129})"),
              place + ".value: the number does not fit its type");
    EXPECT_EQ(errorWith(R"({"type": "uint16[]", "value": 1})"),
              place + ".value: a list is needed here, or an explicit type");
}

TEST(ScenarioError, FaultsAndLatencyAreChecked) {
    EXPECT_EQ(errorOf(R"({"faults": [{"call": "associate"}]})"),
              "x.json: faults[0]: unknown call \"associate\"");
    EXPECT_EQ(errorOf(R"({"latencyMs": [5]})"),
              "x.json: latencyMs: a list of two numbers is needed here");
    EXPECT_EQ(errorOf(R"({"latencyMs": [5, 2]})"),
              "x.json: latencyMs: the second number must not be below the first");
}

TEST(ScenarioError, ManagersAreChecked) {
    EXPECT_EQ(errorOf(R"({"manager": {"kind": "huge"}})"),
              "x.json: manager: unknown manager \"huge\"; managers are host, small, large, worst");
    EXPECT_EQ(errorOf(R"({"manager": "huge"})")
                  .find("x.json: manager: unknown manager or behaviour \"huge\""),
              0u);
    EXPECT_EQ(errorOf(R"({"manager": {"noKey": true}})"),
              "x.json: manager: unknown member \"noKey\"");
}

TEST(ScenarioError, MissingFile) {
    try {
        readScenario("/nowhere/at-all.json");
        FAIL() << "no error";
    } catch (const ScenarioError& error) {
        EXPECT_STREQ(error.what(), "/nowhere/at-all.json: No such file or directory");
    }
}

}  // namespace
}  // namespace testbed
