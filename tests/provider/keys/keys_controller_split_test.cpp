// Splitting the one-identifier keys: a controller's Name, a software identity's InstanceID.
#include <string>
#include <vector>

#include "keys_fixture.h"

namespace {

using plexortest::Allocator;
using plexortest::CapturedSyslog;
using plexortest::FailAllocation;
using plexortest::LogLine;
using plexortest::refusedKey;
using plexortest::ScriptedPath;
using plexortest::SplitKey;

using Lines = std::vector<LogLine>;

class KeysControllerSplitTest : public plexortest::KeysTest {};

TEST_F(KeysControllerSplitTest, GivesWhatFollowsThePrefix) {
    EXPECT_EQ(splitController(pathWith("Name", "tvxControllerC0")),
              (SplitKey{0, "C0", std::nullopt}));
    EXPECT_EQ(CapturedSyslog::lines(), (Lines{{LOG_DEBUG, "RetrieveDeviceID: s1 - C0\n"}}));
}

TEST_F(KeysControllerSplitTest, ReadsTheKeyAndPrefixItIsGiven) {
    EXPECT_EQ(splitController(pathWith("InstanceID", "tovexa:ControllerSoftwareA_B"), "InstanceID",
                              "tovexa:ControllerSoftware"),
              (SplitKey{0, "A_B", std::nullopt}));
    EXPECT_EQ(CapturedSyslog::lines(), (Lines{{LOG_DEBUG, "RetrieveDeviceID: s1 - A_B\n"}}));
}

TEST_F(KeysControllerSplitTest, AsksForThatOneKey) {
    ScriptedPath path;
    path.answerStatus = CMPI_RC_ERR_NOT_FOUND;
    splitController(path.handle(), "InstanceID", "tovexa:ControllerSoftware");
    EXPECT_EQ(path.asked, (std::vector<std::string>{"InstanceID"}));
}

TEST_F(KeysControllerSplitTest, OneCharacterIsAnIdentifierHere) {
    EXPECT_EQ(splitController(pathWith("Name", "tvxController0")),
              (SplitKey{0, "0", std::nullopt}));
}

TEST_F(KeysControllerSplitTest, LongIdentifiersAreNotCut) {
    const std::string id(4000, 'x');
    EXPECT_EQ(splitController(pathWith("Name", "tvxController" + id)),
              (SplitKey{0, id, std::nullopt}));
}

TEST_F(KeysControllerSplitTest, MissingKeyIsLoggedWithKeyAndPath) {
    EXPECT_EQ(splitController(pathWith("Other", "tvxControllerC0")), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR,
                      "Name key not found in object path "
                      "root/cimv2:Tovexa_Any.Other=\"tvxControllerC0\"\n"}}));
}

TEST_F(KeysControllerSplitTest, EveryStatusButOkIsAMissingKey) {
    expectMissingWhateverTheStatus(
        "tvxControllerC0", [](const CMPIObjectPath* path) { return splitController(path); },
        "Name key not found in object path the path\n");
}

TEST_F(KeysControllerSplitTest, PathWithoutTextIsLoggedAsNull) {
    ScriptedPath path;
    path.answerStatus = CMPI_RC_ERR_NOT_FOUND;
    path.text = plexortest::FakeString(nullptr);
    EXPECT_EQ(splitController(path.handle()), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "Name key not found in object path NULL\n"}}));
}

TEST_F(KeysControllerSplitTest, AnotherPrefixIsRefusedSilently) {
    for (const char* text : {"", "t", "tvxControlle", "tvxcontrollerC0", "TVXCONTROLLERC0",
                             " tvxControllerC0", "tovexa:ControllerSoftwareC0", "C0"}) {
        CapturedSyslog::clear();
        EXPECT_EQ(splitController(pathWith("Name", text)), refusedKey(-3)) << text;
        EXPECT_EQ(CapturedSyslog::lines(), Lines{}) << text;
    }
}

TEST_F(KeysControllerSplitTest, BarePrefixIsRefusedWithALine) {
    EXPECT_EQ(splitController(pathWith("Name", "tvxController")), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "No valid info in key key tvxController\n"}}));
}

TEST_F(KeysControllerSplitTest, BareSoftwarePrefixIsRefusedWithALine) {
    EXPECT_EQ(splitController(pathWith("InstanceID", "tovexa:ControllerSoftware"), "InstanceID",
                              "tovexa:ControllerSoftware"),
              refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "No valid info in key key tovexa:ControllerSoftware\n"}}));
}

TEST_F(KeysControllerSplitTest, WithoutMemoryNothingIsStored) {
    const CMPIObjectPath* path = pathWith("Name", "tvxControllerC0");
    const auto fault = FailAllocation::nth(1);
    EXPECT_EQ(splitController(path), refusedKey(-2));
    EXPECT_EQ(CapturedSyslog::lines(), (Lines{{LOG_ERR, "malloc failure\n"}}));
}

// A controller's batteries begin with the controllers' prefix; nobody asks a battery for its Name,
// but a path that carries such a key names controller "BatteryC0_1".
TEST_F(KeysControllerSplitTest, ThePrefixIsAllThatIsCompared) {
    EXPECT_EQ(splitController(pathWith("Name", "tvxControllerBatteryC0_1")),
              (SplitKey{0, "BatteryC0_1", std::nullopt}));
}

}  // namespace
