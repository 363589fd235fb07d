// Which version of a controller's software goes into which field.
#include "controller_fixture.h"
#include "stop_at_line.h"

namespace plexortest {
namespace {

using testbed::CimValue;

class ControllerSoftware : public ControllerTest {
protected:
    void SetUp() override {
        ControllerTest::SetUp();
        card = vendor.controller("C0", addProfile());
    }
    /// Firmware, BIOS, driver and bundle version.
    std::string versions() {
        EXPECT_EQ(build(), 0);
        if (controllers().size() != 1) return "no controller";
        const RaidController_t* ctrl = controllers()[0];
        return textOf(ctrl->FirmwareVersion) + " " + textOf(ctrl->BiosVersion) + " " +
               textOf(ctrl->DriverVersion) + " " + textOf(ctrl->BundleVersion);
    }
    static std::string traceOf(int classification, const std::string& version) {
        return "BuildControllerInfo: ctrl C0, swClass " + std::to_string(classification) +
               ", versionStr " + version + "\n";
    }

    VendorController card;
};

struct Classified {
    int classification;
    const char* versions;
};

void PrintTo(const Classified& software, std::ostream* out) {
    *out << "class " << software.classification;
}

class ControllerSoftwareClass : public ControllerSoftware,
                                public testing::WithParamInterface<Classified> {};

TEST_P(ControllerSoftwareClass, GoesIntoItsField) {
    const auto [classification, expected] = GetParam();
    vendor.software(card.system, static_cast<std::uint16_t>(classification), "1.2");
    EXPECT_EQ(versions(), expected);
    EXPECT_TRUE(logged(LOG_DEBUG, traceOf(classification, "1.2")));
}

INSTANTIATE_TEST_SUITE_P(
    All, ControllerSoftwareClass,
    testing::Values(
        Classified{0, "absent absent absent 1.2"}, Classified{1, "absent absent absent absent"},
        Classified{2, "absent absent 1.2 absent"}, Classified{3, "absent absent absent absent"},
        Classified{9, "absent absent absent absent"}, Classified{10, "1.2 absent absent absent"},
        Classified{11, "absent 1.2 absent absent"}, Classified{12, "absent absent absent absent"},
        Classified{13, "absent absent absent 1.2"}, Classified{14, "absent absent absent absent"},
        Classified{266, "absent absent absent absent"},
        Classified{65535, "absent absent absent absent"}),
    [](const auto& param) { return "Class" + std::to_string(param.param.classification); });

TEST_F(ControllerSoftware, LastOfAClassIsKept) {
    vendor.software(card.system, 10, "1.0");
    vendor.software(card.system, 10, "3.0");
    vendor.software(card.system, 10, "2.0");
    EXPECT_EQ(versions(), "2.0 absent absent absent");
    for (const char* version : {"1.0", "2.0", "3.0"}) {
        EXPECT_TRUE(logged(LOG_DEBUG, traceOf(10, version)));
    }
}

TEST_F(ControllerSoftware, UnknownAndBundleShareAField) {
    vendor.software(card.system, 13, "bundle");
    vendor.software(card.system, 0, "unknown");
    EXPECT_EQ(versions(), "absent absent absent unknown");
    vendor.software(card.system, 13, "bundle2");
    EXPECT_EQ(versions(), "absent absent absent bundle2");
}

TEST_F(ControllerSoftware, LastOneWinsEvenWithoutVersion) {
    vendor.software(card.system, 10, "1.0");
    unset(vendor.software(card.system, 10, "2.0"), "VersionString");
    EXPECT_EQ(versions(), "absent absent absent absent");
}

TEST_F(ControllerSoftware, OnlyTheFirstClassificationCounts) {
    set(vendor.software(card.system, 0, "1.0"), "Classifications",
        CimValue::uint16Array({11, 10, 2}));
    EXPECT_EQ(versions(), "absent 1.0 absent absent");
}

TEST_F(ControllerSoftware, WithoutClassificationItIsABundle) {
    const Path software = vendor.software(card.system, 10, "1.0");
    for (const OddValue& odd : oddArrays()) {
        give(software, "Classifications", odd);
        EXPECT_EQ(versions(), "absent absent absent 1.0") << odd.label;
        EXPECT_TRUE(logged(LOG_DEBUG, traceOf(0, "1.0"))) << odd.label;
    }
}

TEST_F(ControllerSoftware, VersionThatIsNoTextIsAbsent) {
    vendor.software(card.system, 11, "1.0");
    const Path software = vendor.software(card.system, 10, "2.0");
    for (const OddValue& odd : oddTexts()) {
        give(software, "VersionString", odd);
        EXPECT_EQ(versions(), "absent 1.0 absent absent") << odd.label;
    }
}

TEST_F(ControllerSoftware, AbsentVersionIsPrintedAsNull) {
    unset(vendor.software(card.system, 10, "1.0"), "VersionString");
    EXPECT_EQ(versions(), "absent absent absent absent");
    EXPECT_TRUE(logged(LOG_DEBUG, traceOf(10, "NULL")));
}

TEST_F(ControllerSoftware, SoftwareOfThePortControllerIsNotAsked) {
    vendor.software(card.port, 10, "1.0");
    EXPECT_EQ(versions(), "absent absent absent absent");
}

TEST_F(ControllerSoftware, ElementOfAnotherTypeCostsOnlyItself) {
    vendor.software(card.system, 10, "FW");
    vendor.software(card.system, 11, "BIOS");
    vendor.software(card.system, 2, "DRV");
    const Texts expected = {"absent BIOS DRV absent", "FW absent DRV absent",
                            "FW BIOS absent absent"};
    // Elements read before: port controller, system, package.
    for (int wrong = 0; wrong < 3; wrong++) {
        failOnly(wrongElement(3 + wrong));
        EXPECT_EQ(versions(), expected[static_cast<std::size_t>(wrong)]);
    }
}

TEST_F(ControllerSoftware, CopiesThatAreNotKeptAreFreed) {
    for (int i = 0; i < 5; i++) vendor.software(card.system, 10, "FW-" + std::to_string(i));
    for (int i = 0; i < 5; i++) vendor.software(card.system, 99, "any-" + std::to_string(i));
    // The leak checker has the last word.
    EXPECT_EQ(versions(), "FW-4 absent absent absent");
}

TEST_F(ControllerSoftware, AStopEndsTheReadingAtTheRunningVersion) {
    vendor.software(card.system, 10, "FW");
    vendor.software(card.system, 11, "BIOS");
    {
        const StopAtLine stop(traceOf(10, "FW"));
        EXPECT_EQ(build(), 0);
    }
    EXPECT_TRUE(logged(LOG_DEBUG, traceOf(10, "FW")));
    EXPECT_EQ(CapturedSyslog::countContaining(", swClass "), 1u);
}

}  // namespace
}  // namespace plexortest
