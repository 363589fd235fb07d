#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <string>

#include "scenario_parser.h"

namespace testbed {
namespace {

std::string scenarioError(const std::string& text) {
    try {
        parseScenario(text, "x.json");
    } catch (const ScenarioError& error) {
        return error.what();
    }
    return "no error";
}

std::string controllerError(const std::string& controllerMembers) {
    return scenarioError(R"({"controllers": [{"id": "C0", )" + controllerMembers + "}]}");
}

TEST(ScenarioError, BrokenJsonNamesLineAndColumn) {
    EXPECT_EQ(scenarioError("{\n  \"host\": oops}"), "x.json: line 2, column 11: not valid JSON");
    EXPECT_EQ(scenarioError("{\"host\": {},\n\n  \"a\": 1"),
              "x.json: line 3, column 8: not valid JSON");
    EXPECT_EQ(scenarioError(""), "x.json: the file is empty");
    EXPECT_EQ(scenarioError("{}"), "x.json: \"controllers\" is missing");
    EXPECT_EQ(scenarioError("[]"), "x.json: an object is needed here");
}

TEST(ScenarioError, SecondMembersAreRefused) {
    EXPECT_EQ(scenarioError("{\"controllers\": [],\n \"controllers\": []}"),
              "x.json: line 2, column 14: second member \"controllers\"");
    EXPECT_NE(controllerError(R"("drives": [{"id": "a", "id": "b"}])").find("second member \"id\""),
              std::string::npos);
}

TEST(ScenarioError, NestingAndNumbersHaveLimits) {
    const std::string deep(200000, '[');
    EXPECT_EQ(scenarioError(deep), "x.json: line 1, column 65: nested deeper than 64 levels");
    std::string objects;
    for (int i = 0; i < 200000; i++) objects += "{\"a\":";
    EXPECT_NE(scenarioError(objects).find("nested deeper than 64 levels"), std::string::npos);
    EXPECT_NE(scenarioError(R"({"shuffle": 1e999})").find("column 18: the number is too large"),
              std::string::npos)
        << scenarioError(R"({"shuffle": 1e999})");
}

TEST(ScenarioError, RepetitionsOfRepetitionsHaveALimit) {
    EXPECT_EQ(scenarioError(R"({"controllers": [{"count": 100000, "id": "C{n}",
                         "drives": [{"count": 100000, "id": "d{n}"}]}]})"),
              "x.json: more than 1000000 elements with all counts");
}

TEST(ScenarioError, FilesTellTheLine) {
    const std::string file = ::testing::TempDir() + "plexor-lines.json";
    const auto errorOfFile = [&](const std::string& text) {
        std::ofstream(file) << text;
        try {
            readScenario(file);
        } catch (const ScenarioError& error) {
            return std::string(error.what()).substr(file.size());
        }
        return std::string("no error");
    };
    EXPECT_EQ(errorOfFile("{\n\"controllers\": [\n{\"id\": \"C0\",\n\"ports\": [\n"
                          "{\"count\": 8, \"id\": \"{n}\"},\n"
                          "{\"id\": \"9\",\n\"usages\": 2}]}]}\n"),
              ": controllers[0].ports[1]: unknown member \"usages\" (line 7)");
    EXPECT_EQ(errorOfFile("{\"controllers\": [\n{\"id\": \"C0\",\n\"status\": \"well\"}]}")
                  .find(": controllers[0].status: unknown word \"well\""),
              0u);
    EXPECT_EQ(errorOfFile("{\n\"host\": {}}"), ": \"controllers\" is missing (line 1)");
    EXPECT_EQ(errorOfFile(""), ": the file is empty");
    std::filesystem::remove(file);
}

TEST(ScenarioError, UnknownMembersAreRefusedEverywhere) {
    EXPECT_EQ(scenarioError(R"({"hots": {}})"), "x.json: unknown member \"hots\"");
    EXPECT_EQ(scenarioError(R"({"host": {"nmae": "a"}})"), "x.json: host: unknown member \"nmae\"");
    EXPECT_EQ(controllerError(R"("fans": [])"), "x.json: controllers[0]: unknown member \"fans\"");
    EXPECT_EQ(controllerError(R"("drives": [{"id": "d", "sloth": 1}])"),
              "x.json: controllers[0].drives[0]: unknown member \"sloth\"");
    EXPECT_EQ(controllerError(R"("drives": [{"id": "d", "extent": {"status": 1}}])"),
              "x.json: controllers[0].drives[0].extent: unknown member \"status\"");
}

TEST(ScenarioError, UnknownStatesListTheKnownOnes) {
    EXPECT_EQ(controllerError(R"("drives": [{"id": "a"}, {"id": "b", "state": "foo"}])"),
              "x.json: controllers[0].drives[1]: unknown state \"foo\" (known: online, hot spare, "
              "failed, rebuild, rebuilding, copy back, unconfigured good, unconfigured bad, "
              "offline, dormant, "
              "predictive failure, foreign, undefined)");
    EXPECT_NE(
        controllerError(R"("volumes": [{"id": "a", "state": "well"}])").find("(known: optimal,"),
        std::string::npos);
    EXPECT_NE(
        controllerError(R"("status": "well")").find("controllers[0].status: unknown word \"well\""),
        std::string::npos);
    EXPECT_NE(controllerError(R"("software": {"toast": "1"})").find("unknown software \"toast\""),
              std::string::npos);
}

TEST(ScenarioError, ReferencesMustLeadSomewhere) {
    EXPECT_EQ(controllerError(R"("drives": [{"id": "d", "pool": "P9"}])"),
              "x.json: controllers[0].drives[0]: no pool \"P9\"");
    EXPECT_EQ(controllerError(R"("drives": [{"id": "d", "enclosure": 7}])"),
              "x.json: controllers[0].drives[0]: no enclosure \"7\"");
    EXPECT_EQ(controllerError(R"("pools": [{"id": "A"}, {"id": "B"}], "drives": [{"id": "d"}])"),
              "x.json: controllers[0].drives[0]: \"pool\" is missing and there is a choice");
    EXPECT_EQ(scenarioError(R"({"profiles": [{"name": "a", "controllers": ["C7"]}]})"),
              "x.json: profiles[0]: no controller \"C7\"");
}

TEST(ScenarioError, IdsMustDiffer) {
    EXPECT_EQ(controllerError(R"("drives": [{"id": "d"}, {"id": "d"}])"),
              "x.json: controllers[0].drives[1]: second \"d\"");
    EXPECT_EQ(controllerError(R"("ports": [{"id": "p", "count": 2}])"),
              "x.json: controllers[0].ports[0]: second \"p\"");
    EXPECT_EQ(scenarioError(R"({"controllers": [{"id": "C0"}, {"id": "C0"}]})"),
              "x.json: controllers[1]: second controller \"C0\"");
    EXPECT_EQ(controllerError(R"("drives": [{"name": "x"}])"),
              "x.json: controllers[0].drives[0]: \"id\" is missing");
}

TEST(ScenarioError, TypesAndRangesAreChecked) {
    EXPECT_EQ(controllerError(R"("drives": 3)"),
              "x.json: controllers[0].drives: a list is needed here");
    EXPECT_EQ(controllerError(R"("drives": [3])"),
              "x.json: controllers[0].drives[0]: an object is needed here");
    EXPECT_EQ(controllerError(R"("model": true)"),
              "x.json: controllers[0].model: a text is needed here");
    EXPECT_EQ(controllerError(R"("noSystem": 1)"),
              "x.json: controllers[0].noSystem: true or false is needed here");
    const std::string range = ": a whole number from 0 to 65535 is needed here";
    for (const char* slot : {"65536", "-1", "1.5", "\"1a\"", "\"\"", "null"})
        EXPECT_EQ(controllerError(R"("drives": [{"id": "d", "slot": )" + std::string(slot) + "}]"),
                  "x.json: controllers[0].drives[0].slot" + range)
            << slot;
}

TEST(ScenarioError, RepetitionsAreCounted) {
    EXPECT_EQ(controllerError(R"("ports": [{"id": "p{n}", "count": "many"}])"),
              "x.json: controllers[0].ports[0].count: a whole number from 0 to 100000 is needed "
              "here");
    EXPECT_EQ(controllerError(R"("ports": [{"id": "p{n}", "count": 1, "first": -1}])"),
              "x.json: controllers[0].ports[0].first: a whole number from 0 to 4294967295 is "
              "needed here");
}

TEST(ScenarioError, OverridesMustFitTheirType) {
    const auto errorWith = [](const std::string& value) {
        return controllerError(R"("properties": {"HealthState": )" + value + "}");
    };
    const std::string place = "x.json: controllers[0].properties.HealthState";
    EXPECT_EQ(errorWith("70000"), place + ": a whole number from 0 to 65535 is needed here");
    EXPECT_EQ(errorWith(R"({"type": "uint17", "value": 1})"), place + ": unknown type \"uint17\"");
    EXPECT_EQ(errorWith(R"({"type": "uint16"})"), place + ": \"value\" is missing");
    EXPECT_EQ(errorWith(R"({"type": "sint8", "value": -129})"),
              place + ".value: the number does not fit its type");
    // Was taken for -1.
    EXPECT_EQ(errorWith(R"({"type": "sint64", "value": 18446744073709551615})"),
              place + ".value: the number does not fit its type");
    EXPECT_EQ(errorWith(R"({"type": "uint16[]", "value": 1})"),
              place + ".value: a list is needed here, or an explicit type");
}

// They were taken for what is left of them in an int.
TEST(ScenarioError, TimesThatNoIntHoldsAreRefused) {
    const auto errorWith = [](const std::string& times) {
        return scenarioError(R"({"faults": [{"call": "associators", "times": )" + times + "}]}");
    };
    for (const char* times :
         {"2147483648", "-2147483649", "18446744073709551615", "1.0", "\"1\""}) {
        EXPECT_EQ(errorWith(times),
                  "x.json: faults[0].times: a whole number from -2147483648 to 2147483647 is "
                  "needed here")
            << times;
    }
}

TEST(ScenarioError, FaultsAndLatencyAreChecked) {
    EXPECT_EQ(scenarioError(R"({"faults": [{"call": "associate"}]})"),
              "x.json: faults[0]: unknown call \"associate\"");
    EXPECT_EQ(scenarioError(R"({"latencyMs": [5]})"),
              "x.json: latencyMs: a list of two numbers is needed here");
    EXPECT_EQ(scenarioError(R"({"latencyMs": [5, 2]})"),
              "x.json: latencyMs: the second number must not be below the first");
}

TEST(ScenarioError, ManagersAreChecked) {
    EXPECT_EQ(scenarioError(R"({"manager": {"kind": "huge"}})"),
              "x.json: manager: unknown manager \"huge\"; managers are host, small, large, worst");
    EXPECT_EQ(scenarioError(R"({"manager": "huge"})")
                  .find("x.json: manager: unknown manager or behaviour \"huge\""),
              0u);
    EXPECT_EQ(scenarioError(R"({"manager": {"noKey": true}})"),
              "x.json: manager: unknown member \"noKey\"");
}

TEST(ScenarioError, StatusHasTwoNamesAndNoTwoValues) {
    EXPECT_EQ(
        controllerError(R"("drives": [{"id": "d", "status": "ok", "operationalStatus": 3}])"),
        "x.json: controllers[0].drives[0]: \"status\" and \"operationalStatus\" are the same");
}

TEST(ScenarioError, RaidLevelsAreKnown) {
    EXPECT_EQ(controllerError(R"("volumes": [{"id": "0", "raid": "RAID7"}])"),
              "x.json: controllers[0].volumes[0]: unknown RAID level \"RAID7\" (known: RAID0, "
              "RAID1, RAID5, RAID6, RAID10, RAID50, RAID60)");
}

TEST(ScenarioError, DirectoriesAreNoScenarios) {
    try {
        readScenario("/");
        FAIL() << "no error";
    } catch (const ScenarioError& error) {
        EXPECT_STREQ(error.what(), "/: Is a directory");
    }
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
