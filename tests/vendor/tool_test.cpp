// The built tool, run as users run it.
#include <gtest/gtest.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>

namespace {

struct Outcome {
    int status = -1;
    std::string output;
    std::string errors;
};

std::string contentOf(const std::filesystem::path& file) {
    std::ifstream stream(file);
    std::stringstream text;
    text << stream.rdbuf();
    return text.str();
}

class Tool : public ::testing::Test {
protected:
    void SetUp() override {
        unsetenv("PLEXOR_PROVIDER_LIBRARY");
        // The thread checker of gcc 12 does not see a join that has a deadline.
        setenv("TSAN_OPTIONS", "report_thread_leaks=0", 0);
        std::string pattern = ::testing::TempDir() + "plexor-tool-XXXXXX";
        ASSERT_NE(mkdtemp(pattern.data()), nullptr);
        directory_ = pattern;
    }
    void TearDown() override {
        std::filesystem::remove_all(directory_);
        unsetenv("ASAN_OPTIONS");
    }

    /// The provider abandons the texts of a volume that has no pool; a build with a leak check
    /// would end with the checker's status.
    void allowLeaks() { setenv("ASAN_OPTIONS", "detect_leaks=0", 1); }

    Outcome run(const std::string& arguments) {
        const std::string command = "LC_ALL=C.UTF-8 " + std::string(TOOL) + " " + arguments + " >" +
                                    (directory_ / "out").string() + " 2>" +
                                    (directory_ / "err").string();
        const int status = std::system(command.c_str());
        return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, contentOf(directory_ / "out"),
                contentOf(directory_ / "err")};
    }

    Outcome show(const std::string& scenario, const std::string& more) {
        return run("show --scenario " SCENARIO_DIR "/" + scenario + ".json " + more);
    }

    std::filesystem::path directory_;
};

/// Fails with one line on standard error that starts with the tool's name, and says nothing else.
void expectOneLine(const Outcome& outcome, const std::string& text) {
    EXPECT_EQ(outcome.status, 1);
    EXPECT_EQ(outcome.output, "");
    EXPECT_EQ(outcome.errors.find("plexor-testbed: "), 0u) << outcome.errors;
    EXPECT_EQ(std::count(outcome.errors.begin(), outcome.errors.end(), '\n'), 1) << outcome.errors;
    EXPECT_NE(outcome.errors.find(text), std::string::npos) << outcome.errors;
}

TEST_F(Tool, ManagersAreThoseOfTheManual) {
    const Outcome table = run("managers");
    EXPECT_EQ(table.status, 0);
    EXPECT_EQ(std::count(table.output.begin(), table.output.end(), '\n'), 23) << table.output;
    EXPECT_NE(contentOf(MANAGERS_MANUAL).find("\n\n" + table.output + "\n"), std::string::npos);
}

TEST_F(Tool, ManagerIsChosenOnTheCommandLine) {
    const Outcome calls = run("calls --scenario " SCENARIO_DIR "/no-such.json --manager huge");
    EXPECT_EQ(calls.status, 2);
    EXPECT_NE(calls.errors.find("unknown manager or behaviour \"huge\""), std::string::npos);
    const Outcome usual = show("degraded-array", "");
    const Outcome shuffled = show("degraded-array", "--manager random-order");
    EXPECT_EQ(shuffled.status, 0) << shuffled.errors;
    EXPECT_EQ(shuffled.output.size(), usual.output.size());
    EXPECT_NE(shuffled.output, usual.output);
}

TEST_F(Tool, UsageErrorsExitWithTwo) {
    EXPECT_EQ(run("").status, 2);
    EXPECT_EQ(run("show").status, 2);
    EXPECT_EQ(run("dance").status, 2);
    EXPECT_EQ(show("healthy-array", "--class CIM_Battery").status, 2);
    EXPECT_EQ(run("show --help").status, 0);
}

TEST_F(Tool, BadScenarioIsOneLine) {
    expectOneLine(run("show --scenario /nowhere.json"), "/nowhere.json: No such file");
    const std::string file = (directory_ / "bad.json").string();
    std::ofstream(file)
        << R"({"controllers": [{"id": "C0", "drives": [{"id": "d", "state": "foo"}]}]})";
    expectOneLine(run("show --scenario " + file),
                  "bad.json: controllers[0].drives[0]: unknown state \"foo\"");
    std::ofstream(file) << "{";
    expectOneLine(run("show --scenario " + file), "not valid JSON");
}

TEST_F(Tool, MissingLibraryIsOneLine) {
    expectOneLine(show("healthy-array", "--library /nowhere/lib.so"), "/nowhere/lib.so");
    const std::string file = (directory_ / "text.so").string();
    std::ofstream(file) << "not a library";
    expectOneLine(show("healthy-array", "--library " + file), "text.so");
}

TEST_F(Tool, LibraryWithoutFactoryIsOneLine) {
    expectOneLine(show("healthy-array", "--library " NO_FACTORY),
                  "has no factory PlexorProvider_Create_InstanceMI");
    expectOneLine(show("healthy-array", "--library " PROVIDER " --provider Other"),
                  "has no factory Other_Create_InstanceMI");
    expectOneLine(show("healthy-array", "--library " EMPTY_FACTORY),
                  "PlexorProvider_Create_InstanceMI returned no instance interface");
}

TEST_F(Tool, EnvironmentNamesTheLibrary) {
    setenv("PLEXOR_PROVIDER_LIBRARY", NO_FACTORY, 1);
    expectOneLine(show("healthy-array", ""), "no-factory");
    unsetenv("PLEXOR_PROVIDER_LIBRARY");
}

TEST_F(Tool, ShowsADegradedArrayAsATree) {
    const Outcome outcome = show("degraded-array", "--library " PROVIDER);
    EXPECT_EQ(outcome.status, 0) << outcome.errors;
    for (const char* text : {"Controller C0 (RC-308)", "4.2.1 (Package); 23.9.0 (Fw)",
                             "RAID5 data Logical Volume 0 on controller C0", " - DEGRADED",
                             "Drives (9)", "Drive 32_3 on controller C0 Fw: GS0F - FAILED",
                             "Drive 32_7 on controller C0 Fw: GS0F - REBUILD", "- UNCONFIGURED BAD",
                             "Ports (8)", "battery low"})
        EXPECT_NE(outcome.output.find(text), std::string::npos) << text << "\n" << outcome.output;
}

TEST_F(Tool, ShowsTwoControllersAsJson) {
    const Outcome outcome = show("two-controllers", "--json --library " PROVIDER);
    ASSERT_EQ(outcome.status, 0) << outcome.errors;
    const auto document = nlohmann::json::parse(outcome.output);
    EXPECT_EQ(document.at("Tovexa_PlexorController").size(), 2u);
    EXPECT_EQ(document.at("Tovexa_PlexorSoftwareIdentity").size(), 2u);
    EXPECT_EQ(document.at("Tovexa_PlexorStorageVolume").size(), 4u);
    EXPECT_EQ(document.at("Tovexa_PlexorStorageExtent").size(), 15u);
    EXPECT_EQ(document.at("Tovexa_PlexorSASSATAPort").size(), 16u);
    EXPECT_EQ(document.at("Tovexa_PlexorBattery").size(), 2u);
}

TEST_F(Tool, ShowsOneClassAndTheLog) {
    allowLeaks();
    const Outcome outcome =
        show("no-pools", "--json --log --class Tovexa_PlexorStorageExtent --library " PROVIDER);
    ASSERT_EQ(outcome.status, 0) << outcome.errors;
    const auto document = nlohmann::json::parse(outcome.output);
    EXPECT_EQ(document.size(), 3u) << "beside the format and the errors";
    EXPECT_TRUE(document.at("Tovexa_PlexorStorageExtent").empty()) << "drives without a pool";
    EXPECT_NE(outcome.errors.find("No pool associated with disk"), std::string::npos);
}

TEST_F(Tool, SurvivesAHostileVendor) {
    allowLeaks();
    const Outcome outcome = show("hostile-vendor", "--library " PROVIDER);
    EXPECT_EQ(outcome.status, 0) << outcome.errors;
    EXPECT_NE(outcome.output.find("Controller X0 (%s%n %d)"), std::string::npos);
    EXPECT_EQ(outcome.output.find("Controller NoName"), std::string::npos);
    EXPECT_EQ(outcome.output.find("Controller FIdentity"), std::string::npos);
}

TEST_F(Tool, HostThatCannotBeFoundShowsNothing) {
    const std::string file = (directory_ / "absent.json").string();
    std::ofstream(file) << R"({"host": {"absent": true}, "controllers": [{"id": "C0"}]})";
    const Outcome outcome = run("show --scenario " + file + " --library " PROVIDER);
    EXPECT_EQ(outcome.status, 0) << outcome.errors;
    EXPECT_EQ(outcome.output, "nothing\n");
}

TEST_F(Tool, InventoryThatIsLateExitsWithThree) {
    const std::string file = (directory_ / "slow.json").string();
    std::ofstream(file) << R"({"controllers": [{"id": "C0"}], "faults":
        [{"call": "associators", "assocClass": "CIM_HostedStoragePool", "delayMs": 1500}]})";
    const Outcome outcome = run("show --timeout 0 --scenario " + file + " --library " PROVIDER);
    EXPECT_EQ(outcome.status, 3);
    EXPECT_EQ(outcome.errors, "plexor-testbed: the inventory is not complete after 0 s\n");
    EXPECT_NE(outcome.output.find("Controller C0"), std::string::npos) << "what is there is shown";
}

}  // namespace
