// Splitting a logical device's DeviceID key into controller and device.
#include <stdlib.h>

#include <string>
#include <vector>

#include "keys_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::FailAllocation;
using plexortest::LogLine;
using plexortest::refusedKey;
using plexortest::ScriptedPath;
using plexortest::SplitKey;

using Lines = std::vector<LogLine>;

constexpr const char* kPrefixes[] = {"tvxStorageVolume", "tvxStorageExt", "tvxPort",
                                     "tvxControllerBattery"};

class KeysDeviceSplitTest : public plexortest::KeysTest {
protected:
    SplitKey split(const std::string& key, const char* prefix = "tvxStorageVolume") {
        CapturedSyslog::clear();
        return splitDevice(pathWith("DeviceID", key), prefix);
    }
};

TEST_F(KeysDeviceSplitTest, GivesControllerAndDeviceForEveryPrefix) {
    for (const std::string prefix : kPrefixes) {
        EXPECT_EQ(split(prefix + "12_5", prefix.c_str()), (SplitKey{0, "12", "5"})) << prefix;
        EXPECT_EQ(CapturedSyslog::lines(),
                  (Lines{{LOG_DEBUG, "RetrieveControllerAndDeviceIDs: s1 - 12, s2 - 5\n"}}))
            << prefix;
    }
}

TEST_F(KeysDeviceSplitTest, AsksForDeviceIdAlone) {
    ScriptedPath path;
    path.answerStatus = CMPI_RC_ERR_NOT_FOUND;
    splitDevice(path.handle(), "tvxPort");
    EXPECT_EQ(path.asked, (std::vector<std::string>{"DeviceID"}));
}

TEST_F(KeysDeviceSplitTest, TheFirstUnderscoreSeparates) {
    EXPECT_EQ(split("tvxPortAB_C_D", "tvxPort"), (SplitKey{0, "AB", "C_D"}));
    EXPECT_EQ(split("tvxPortAB__", "tvxPort"), (SplitKey{0, "AB", "_"}));
    EXPECT_EQ(split("tvxPortAB_C_", "tvxPort"), (SplitKey{0, "AB", "C_"}));
}

TEST_F(KeysDeviceSplitTest, EmptyControllerIsAccepted) {
    EXPECT_EQ(split("tvxStorageVolume_5"), (SplitKey{0, "", "5"}));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_DEBUG, "RetrieveControllerAndDeviceIDs: s1 - , s2 - 5\n"}}));
}

TEST_F(KeysDeviceSplitTest, ControllerOfOneCharacterIsRefused) {
    EXPECT_EQ(split("tvxStorageVolume0_5"), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "Controller ID not found in key tvxStorageVolume0_5\n"}}));
}

TEST_F(KeysDeviceSplitTest, ControllerOfOneCharacterIsRefusedBeforeTheDeviceIsLookedAt) {
    EXPECT_EQ(split("tvxStorageVolume0_"), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "Controller ID not found in key tvxStorageVolume0_\n"}}));
}

TEST_F(KeysDeviceSplitTest, KeyWithoutUnderscoreIsRefused) {
    EXPECT_EQ(split("tvxStorageVolume125"), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "Device ID not found in key tvxStorageVolume125\n"}}));
}

TEST_F(KeysDeviceSplitTest, EmptyDeviceIsRefused) {
    EXPECT_EQ(split("tvxStorageVolume12_"), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "Device ID empty in key tvxStorageVolume12_\n"}}));
}

TEST_F(KeysDeviceSplitTest, EmptyControllerAndDeviceAreRefusedForTheDevice) {
    EXPECT_EQ(split("tvxStorageVolume_"), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "Device ID empty in key tvxStorageVolume_\n"}}));
}

TEST_F(KeysDeviceSplitTest, BarePrefixIsRefusedWithALine) {
    for (const std::string prefix : kPrefixes) {
        EXPECT_EQ(split(prefix, prefix.c_str()), refusedKey(-3));
        EXPECT_EQ(CapturedSyslog::lines(),
                  (Lines{{LOG_ERR, "No valid info in key key " + prefix + "\n"}}));
    }
}

TEST_F(KeysDeviceSplitTest, PrefixOfAnotherClassIsRefusedSilently) {
    for (const std::string own : kPrefixes) {
        for (const std::string other : kPrefixes) {
            if (own == other) continue;
            EXPECT_EQ(split(other + "12_5", own.c_str()), refusedKey(-3)) << own << other;
            EXPECT_EQ(CapturedSyslog::lines(), Lines{}) << own << other;
        }
    }
}

TEST_F(KeysDeviceSplitTest, PrefixIsComparedWithCaseAndInFull) {
    for (const char* key : {"", "tvxPor", "tvxport12_5", "TVXPORT12_5", " tvxPort12_5", "12_5"}) {
        EXPECT_EQ(split(key, "tvxPort"), refusedKey(-3)) << key;
        EXPECT_EQ(CapturedSyslog::lines(), Lines{}) << key;
    }
}

TEST_F(KeysDeviceSplitTest, MissingKeyIsLoggedWithThePath) {
    EXPECT_EQ(splitDevice(pathWith("Name", "tvxPort12_5"), "tvxPort"), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(), (Lines{{LOG_ERR,
                                               "DeviceID key not found in object path "
                                               "root/cimv2:Tovexa_Any.Name=\"tvxPort12_5\"\n"}}));
}

TEST_F(KeysDeviceSplitTest, EveryStatusButOkIsAMissingKey) {
    expectMissingWhateverTheStatus(
        "tvxPort12_5", [](const CMPIObjectPath* path) { return splitDevice(path, "tvxPort"); },
        "DeviceID key not found in object path the path\n");
}

TEST_F(KeysDeviceSplitTest, WithoutMemoryNothingIsStoredAndNothingLeaks) {
    const CMPIObjectPath* path = pathWith("DeviceID", "tvxPort12_5");
    for (const std::size_t failing : {1u, 2u}) {
        CapturedSyslog::clear();
        const auto fault = FailAllocation::nth(failing, plexortest::Allocator::Malloc);
        EXPECT_EQ(splitDevice(path, "tvxPort"), refusedKey(-2)) << failing;
        EXPECT_EQ(CapturedSyslog::lines(), (Lines{{LOG_ERR, "malloc failure\n"}})) << failing;
    }
}

TEST_F(KeysDeviceSplitTest, NeedsTwoCopiesAndNoMore) {
    const CMPIObjectPath* path = pathWith("DeviceID", "tvxPort12_5");
    const auto counted = FailAllocation::none();
    splitDevice(path, "tvxPort");
    EXPECT_EQ(counted.calls(), 2u);
}

TEST_F(KeysDeviceSplitTest, LongIdentifiersAreNotCut) {
    const std::string ctrl(300, 'c'), device(3000, 'd');
    EXPECT_EQ(split("tvxStorageVolume" + ctrl + "_" + device), (SplitKey{0, ctrl, device}));
}

// What the provider composes comes back as it was, unless the controller has an underscore.
TEST_F(KeysDeviceSplitTest, ComposedKeysComeBack) {
    char* key = MakeLogicalDeviceID("C0", "5:1_x", "tvxStorageVolume");
    EXPECT_EQ(split(key), (SplitKey{0, "C0", "5:1_x"}));
    free(key);
}

TEST_F(KeysDeviceSplitTest, ControllerWithAnUnderscoreComesBackCut) {
    char* key = MakeLogicalDeviceID("AA_B", "5", "tvxStorageVolume");
    EXPECT_EQ(split(key), (SplitKey{0, "AA", "B_5"}));
    free(key);
}

// Controller A_B: its keys parse to controller A, which has one character.
TEST_F(KeysDeviceSplitTest, ControllerOfOneCharacterAndAnUnderscoreIsRefused) {
    char* key = MakeLogicalDeviceID("A_B", "5", "tvxStorageVolume");
    EXPECT_EQ(split(key), refusedKey(-3));
    EXPECT_EQ(CapturedSyslog::lines(),
              (Lines{{LOG_ERR, "Controller ID not found in key tvxStorageVolumeA_B_5\n"}}));
    free(key);
}

}  // namespace
