// Every scenario through the provider, served and asked, as users do it.
#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <future>
#include <regex>
#include <thread>

#include "tool_process.h"

namespace {

std::string file(const std::string& scenario) {
    return SCENARIO_DIR "/" + scenario + ".json";
}

/// What is printed when the provider has all of its devices.
Outcome show(const std::string& scenario, const std::string& more = "") {
    return runTool("show --scenario " + file(scenario) + " --library " PROVIDER " " + more);
}

struct Expectation {
    const char* scenario;
    int status;
    /// Of the line of --check.
    std::string text;
};

void PrintTo(const Expectation& expectation, std::ostream* stream) {
    *stream << expectation.scenario;
}

const Expectation kExpectations[] = {
    {"healthy-array", 0,
     "PLEXOR OK - 1 controller, 2 volumes, 8 drives, 8 ports, 1 battery"
     " | controllers=1 volumes=2 drives=8 ports=8 batteries=1 warning=0 critical=0\n"},
    {"degraded-array", 2,
     "PLEXOR CRITICAL - 1 drive failed: Drive 32_3 on controller C0; 1 volume degraded: RAID5 data "
     "Logical Volume 0 on controller C0; 1 drive rebuilding: Drive 32_7 on controller C0; 1 drive "
     "unconfigured bad: Drive 32_8 on controller C0; 1 battery low: Battery 0 on Controller C0"
     " | controllers=1 volumes=2 drives=9 ports=8 batteries=1 warning=4 critical=1\n"},
    {"two-controllers", 0,
     "PLEXOR OK - 2 controllers, 4 volumes, 15 drives, 16 ports, 2 batteries"
     " | controllers=2 volumes=4 drives=15 ports=16 batteries=2 warning=0 critical=0\n"},
    {"no-pools", 2,
     "PLEXOR CRITICAL - 1 battery no contact: Battery 0 on Controller C0"
     " | controllers=1 volumes=0 drives=0 ports=4 batteries=1 warning=0 critical=1\n"},
    {"many-drives", 0,
     "PLEXOR OK - 1 controller, 10 volumes, 240 drives, 8 ports, 1 battery"
     " | controllers=1 volumes=10 drives=240 ports=8 batteries=1 warning=0 critical=0\n"},
};

class AskScenario : public ::testing::TestWithParam<Expectation> {
protected:
    void SetUp() override {
        // The provider abandons the texts of a volume that has no pool; a build with a leak check
        // would end with the checker's status.
        setenv("ASAN_OPTIONS", "detect_leaks=0", 1);
    }
    void TearDown() override { unsetenv("ASAN_OPTIONS"); }
};

/// Asks until the provider has all of its devices: the answer must come to be `wanted`.
Outcome askUntil(const std::string& arguments, const std::string& wanted) {
    Outcome outcome;
    for (int i = 0; i < 100 && outcome.output != wanted; i++) {
        if (i > 0) std::this_thread::sleep_for(std::chrono::milliseconds(300));
        outcome = runTool(arguments);
    }
    return outcome;
}

/// The show commands mostly wait for the vendor, so they do it at the same time.
TEST_P(AskScenario, AskSeesWhatShowSees) {
    const Expectation& expected = GetParam();
    const auto start = [&](const char* more) {
        return std::async(std::launch::async,
                          [&expected, more] { return show(expected.scenario, more); });
    };
    auto showTree = start(""), showJson = start("--json"), showCheck = start("--check");
    const ServingTool serving("--scenario " + file(expected.scenario) + " --library " PROVIDER);
    const Outcome tree = showTree.get();
    ASSERT_EQ(tree.status, 0) << tree.errors;
    const Outcome asked = askUntil("ask " + serving.url(), tree.output);
    EXPECT_EQ(asked.output, tree.output);
    EXPECT_EQ(asked.status, 0) << asked.errors;
    const Outcome json = showJson.get();
    EXPECT_NE(json.output.find("\"HealthState\": 5"), std::string::npos);
    EXPECT_EQ(runTool("ask --json " + serving.url()).output, json.output);
    for (const Outcome& checked :
         {showCheck.get(), runTool("ask --check --refresh 0.1 " + serving.url())}) {
        const std::regex time(" time=[0-9]+\\.[0-9]{3}s;;;0;30");
        EXPECT_EQ(std::regex_replace(checked.output, time, ""), expected.text);
        EXPECT_EQ(checked.status, expected.status);
    }
}

INSTANTIATE_TEST_SUITE_P(All, AskScenario, ::testing::ValuesIn(kExpectations));

TEST(ShowCheck, KnowsEveryStateOfTheProvider) {
    const Outcome outcome =
        runTool("show --check --library " PROVIDER " --scenario " STATES_SCENARIO);
    EXPECT_EQ(outcome.status, 2) << outcome.errors;
    EXPECT_EQ(outcome.output,
              "PLEXOR CRITICAL - 1 volume offline: Logical Volume v3 on controller C0; "
              "1 drive failed: Drive broken on controller C0; "
              "1 drive offline: Drive gone on controller C0; "
              "1 port error: Port 2 on Controller C0; "
              "1 battery critical: Battery b4 on Controller C0; "
              "1 battery no contact: Battery b5 on Controller C0; "
              "2 volumes degraded: Logical Volume v1 on controller C0, "
              "Logical Volume v2 on controller C0; "
              "1 volume undefined: Logical Volume v4 on controller C0; "
              "1 drive rebuilding: Drive new on controller C0; "
              "1 drive unconfigured bad: Drive bad on controller C0; "
              "1 drive predictive failure: Drive old on controller C0; "
              "1 battery low: Battery b3 on Controller C0"
              " | controllers=1 volumes=5 drives=9 ports=4 batteries=6 warning=7 critical=6\n");
}

TEST(ShowCheck, SurvivesAHostileVendor) {
    setenv("ASAN_OPTIONS", "detect_leaks=0", 1);
    const Outcome outcome = show("hostile-vendor", "--check");
    unsetenv("ASAN_OPTIONS");
    EXPECT_EQ(outcome.status, 2) << outcome.errors;
    for (const char* text : {"1 battery critical: Battery b0 on Controller X0",
                             "1 volume degraded: RAID5 %n%n%n Logical Volume v0 on controller X0",
                             "1 volume undefined", "1 port unknown: Port p2 on Controller X0",
                             "1 drive unknown: Drive d10", "1 drive undefined: Drive d12"})
        EXPECT_NE(outcome.output.find(text), std::string::npos) << text << "\n" << outcome.output;
}

TEST(ShowCheck, IsUnknownWhenItCannotBeShown) {
    const Outcome outcome = runTool("show --check --scenario /nowhere.json");
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.output.find("PLEXOR UNKNOWN - /nowhere.json"), 0u) << outcome.output;
    EXPECT_EQ(outcome.errors, "");
}

TEST(ShowCheck, IsUnknownWhenTheInventoryIsLate) {
    const auto slow = std::filesystem::path(::testing::TempDir()) / "plexor-ask-slow.json";
    std::ofstream(slow) << R"({"controllers": [{"id": "C0"}], "faults":
        [{"call": "associators", "assocClass": "CIM_HostedStoragePool", "delayMs": 1500}]})";
    const Outcome outcome =
        runTool("show --check --timeout 0 --library " PROVIDER " --scenario " + slow.string());
    std::filesystem::remove(slow);
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.output.find("PLEXOR UNKNOWN - the inventory is not complete after 0 s"), 0u)
        << outcome.output;
}

}  // namespace
