// Which kind a device is of, and how seldom the broker is asked.
#include "devices_fixture.h"

namespace plexortest {
namespace {

using testing::ElementsAre;

class DevicesClassify : public DevicesTest {
protected:
    void SetUp() override {
        DevicesTest::SetUp();
        for (const char* letter : {"A", "B", "C"}) {
            defineClass(std::string("Volume") + letter, "CIM_StorageVolume");
            defineClass(std::string("Port") + letter, "CIM_SASSATAPort");
            defineClass(std::string("Drive") + letter, "CIM_DiskDrive");
            defineClass(std::string("Battery") + letter, "CIM_Battery");
            defineClass(std::string("Fan") + letter, "CIM_Fan");
        }
    }
    /// The broker's answers asked for: "<class of the path>?<class>".
    Texts questions() {
        Texts asked;
        for (const testbed::CallRecord& call : books().calls()) {
            if (call.entry != Entry::ClassPathIsA) continue;
            asked.push_back(call.className + "?" + call.name.value());
        }
        return asked;
    }
    /// The codes in the trace lines, in order.
    static std::vector<int> tracedCodes() {
        std::vector<int> codes;
        for (const std::string& text : CapturedSyslog::linesAt(LOG_DEBUG)) {
            int code = 0;
            if (sscanf(text.c_str(), "BuildLogicalDeviceInfo: (%d)", &code) == 1) {
                codes.push_back(code);
            }
        }
        return codes;
    }
};

TEST_F(DevicesClassify, FirstThatIsTrueDecides) {
    addDevice("VolumeA", "1");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(questions(), ElementsAre("VolumeA?CIM_StorageVolume"));
}

TEST_F(DevicesClassify, AllFourAreAskedInTheirOrder) {
    addDevice("BatteryA", "1");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(questions(), ElementsAre("BatteryA?CIM_StorageVolume", "BatteryA?CIM_SASSATAPort",
                                         "BatteryA?CIM_DiskDrive", "BatteryA?CIM_Battery"));
}

struct Sequence {
    const char* name;
    std::vector<std::string> classes;
    std::vector<int> codes;
    std::size_t questions;
};

void PrintTo(const Sequence& sequence, std::ostream* out) {
    *out << testing::PrintToString(sequence.classes);
}

class DevicesSequence : public DevicesClassify, public testing::WithParamInterface<Sequence> {};

TEST_P(DevicesSequence, CostsExactlyThatManyQuestions) {
    const Sequence& sequence = GetParam();
    Texts expected;
    for (std::size_t i = 0; i < sequence.classes.size(); i++) {
        addDevice(sequence.classes[i], std::to_string(i));
        const int code = sequence.codes[i];
        if (code != 99) expected.push_back(std::to_string(code) + " " + std::to_string(i));
    }
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(tracedCodes(), sequence.codes);
    EXPECT_EQ(taken(), expected);
    EXPECT_EQ(questions().size(), sequence.questions) << testing::PrintToString(questions());
    // Nothing else is asked but the devices themselves.
    EXPECT_EQ(books().calls().size(), 1 + sequence.questions);
}

// The sums are the questions of each element in turn.
INSTANTIATE_TEST_SUITE_P(
    All, DevicesSequence,
    testing::Values(
        Sequence{"Volume", {"VolumeA"}, {1}, 1}, Sequence{"Port", {"PortA"}, {2}, 2},
        Sequence{"Drive", {"DriveA"}, {3}, 3}, Sequence{"Battery", {"BatteryA"}, {4}, 4},
        Sequence{"Other", {"FanA"}, {99}, 4},
        Sequence{"SameClassInARow", {"DriveA", "DriveA", "DriveA", "DriveA"}, {3, 3, 3, 3}, 3},
        Sequence{"OtherClassInARow", {"FanA", "FanA", "FanA"}, {99, 99, 99}, 4},
        Sequence{"KnownClassesComeBack",
                 {"DriveA", "VolumeA", "DriveA", "VolumeA", "DriveA"},
                 {3, 1, 3, 1, 3},
                 3 + 1},
        Sequence{"BatteriesComeBack", {"BatteryA", "PortA", "BatteryA"}, {4, 2, 4}, 4 + 2 + 0},
        Sequence{"AllKindsThereAndBack",
                 {"VolumeA", "PortA", "DriveA", "BatteryA", "DriveA", "PortA", "VolumeA"},
                 {1, 2, 3, 4, 3, 2, 1},
                 1 + 2 + 3 + 4},
        Sequence{"OthersAreNotKept", {"FanA", "DriveA", "FanA"}, {99, 3, 99}, 4 + 3 + 4},
        Sequence{"OtherOthersAreNotKept", {"FanA", "FanB", "FanA"}, {99, 99, 99}, 4 + 4 + 4},
        // A hit in the table leaves the class asked about last as the previous one.
        Sequence{"TableHitLeavesThePrevious",
                 {"DriveA", "FanA", "DriveA", "FanA"},
                 {3, 99, 3, 99},
                 3 + 4 + 0 + 0},
        Sequence{"TableHitsLeaveThePrevious",
                 {"DriveA", "VolumeA", "FanA", "DriveA", "VolumeA", "DriveA", "FanA", "FanA"},
                 {3, 1, 99, 3, 1, 3, 99, 99},
                 3 + 1 + 4 + 0 + 0 + 0 + 0 + 0},
        Sequence{"AskingReplacesThePrevious",
                 {"FanA", "DriveA", "VolumeA", "DriveA", "FanA"},
                 {99, 3, 1, 3, 99},
                 4 + 3 + 1 + 0 + 4},
        // One class for each kind is kept, the latest.
        Sequence{"SlotIsOverwritten", {"DriveA", "DriveB", "DriveA"}, {3, 3, 3}, 3 + 3 + 3},
        Sequence{"OverwrittenSlotKeepsTheLatest",
                 {"DriveA", "DriveB", "VolumeA", "DriveB", "DriveA", "DriveB"},
                 {3, 3, 1, 3, 3, 3},
                 3 + 3 + 1 + 0 + 3 + 3},
        Sequence{"SlotsOfOtherKindsStay",
                 {"VolumeA", "DriveA", "DriveB", "VolumeA"},
                 {1, 3, 3, 1},
                 1 + 3 + 3 + 0},
        Sequence{"PreviousIsTriedBeforeTheTable",
                 {"PortA", "PortB", "PortB", "PortC", "PortB"},
                 {2, 2, 2, 2, 2},
                 2 + 2 + 0 + 2 + 2}),
    [](const auto& param) { return param.param.name; });

TEST_F(DevicesClassify, CachesLiveForOneWalk) {
    addDevice("DriveA", "1");
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(questions().size(), 3u);
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(questions().size(), 3u);
}

TEST_F(DevicesClassify, CimClassesThemselves) {
    addDevice("CIM_Battery", "0");
    addDevice("CIM_DiskDrive", "1");
    addDevice("CIM_SASSATAPort", "2");
    addDevice("CIM_StorageVolume", "3");
    addDevice("CIM_StorageExtent", "4");
    addDevice("CIM_LogicalDevice", "5");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(taken(), ElementsAre("4 0", "3 1", "2 2", "1 3"));
    EXPECT_THAT(tracedCodes(), ElementsAre(4, 3, 2, 1, 99, 99));
}

TEST_F(DevicesClassify, DeepSubclass) {
    defineClass("DriveDeep", "DriveA");
    defineClass("DriveDeeper", "DriveDeep");
    addDevice("DriveDeeper", "1");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(taken(), ElementsAre("3 1"));
}

TEST_F(DevicesClassify, VolumeThatIsADriveTooIsAVolume) {
    defineClass("CIM_StorageVolume", "CIM_DiskDrive");
    addDevice("VolumeA", "1");
    addDevice("DriveA", "2");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(taken(), ElementsAre("1 1", "3 2"));
}

TEST_F(DevicesClassify, PortThatIsABatteryTooIsAPort) {
    defineClass("CIM_Battery", "CIM_SASSATAPort");
    addDevice("BatteryA", "1");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(taken(), ElementsAre("2 1"));
}

TEST_F(DevicesClassify, RefusedQuestionIsANo) {
    addDevice("DriveA", "1");
    addDevice("BatteryA", "2");
    auto rule = refusal(Entry::ClassPathIsA);
    rule.name = "CIM_DiskDrive";
    failOnly(rule);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(tracedCodes(), ElementsAre(99, 4));
    EXPECT_EQ(questions().size(), 8u);
}

}  // namespace
}  // namespace plexortest
