// What a client sees of ports and batteries.
#include <string>

#include "PlexorProviderIfc.h"
#include "owned_text.h"
#include "provider_fixture.h"
#include "render_recorder.h"

namespace plexortest {
namespace {

/// HealthState for each OperationalStatus from 0 to 18, and what lies behind them.
constexpr CMPIUint16 kHealthByStatus[] = {0, 0, 5,  0, 0, 0, 30, 0, 0, 0,
                                          0, 0, 20, 0, 0, 5, 0,  0, 0};
constexpr CMPIUint16 kStatuses = sizeof kHealthByStatus / sizeof kHealthByStatus[0];

TEST(RenderHealthState, FollowsTheOperationalStatus) {
    for (CMPIUint16 status = 0; status < kStatuses; status++) {
        EXPECT_EQ(kHealthByStatus[status], GetHealthStateByOpStatus(status)) << "status " << status;
    }
    for (const CMPIUint16 status : {19, 256 + 2, 32768, 65535}) {
        EXPECT_EQ(0, GetHealthStateByOpStatus(status)) << "status " << status;
    }
}

class RenderPort : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        port = attach(ctrl, newPort("p1"));
        setText(port->PortName, "Port A");
        port->OperationalStatus = 2;
        port->PortType = 94;
        port->UsageRestriction = 3;
    }
    std::vector<PropertyCall> rows() { return rowsOf(FillPortInstance, ctrl, port); }
    std::string name() { return valueOf(rows(), "ElementName"); }

    RaidController_t* ctrl = nullptr;
    SASSATAPort_t* port = nullptr;
};

TEST_F(RenderPort, SetsEveryPropertyInOrder) {
    const std::vector<PropertyCall> expected = {
        charsRow("ElementName", "Port A on Controller C0"),
        charsRow("Caption", "Port A on Controller C0"),
        uint16ArrayRow("OperationalStatus", 2),
        uint16Row("HealthState", 5),
        uint16Row("PortType", 94),
        uint16Row("UsageRestriction", 3),
    };
    EXPECT_EQ(expected, rows());
}

TEST_F(RenderPort, HealthFollowsTheStatus) {
    for (CMPIUint16 status = 0; status < kStatuses; status++) {
        port->OperationalStatus = status;
        EXPECT_EQ(std::to_string(kHealthByStatus[status]), valueOf(rows(), "HealthState"));
        EXPECT_EQ("uint16[1]{0:uint16 " + std::to_string(status) + "}",
                  valueOf(rows(), "OperationalStatus"));
    }
}

TEST_F(RenderPort, LargeNumbersArePassedOn) {
    port->OperationalStatus = 65535;
    port->PortType = 65534;
    port->UsageRestriction = 65533;
    EXPECT_EQ("uint16[1]{0:uint16 65535}", valueOf(rows(), "OperationalStatus"));
    EXPECT_EQ("65534", valueOf(rows(), "PortType"));
    EXPECT_EQ("65533", valueOf(rows(), "UsageRestriction"));
}

TEST_F(RenderPort, PercentSignsAreOnlyText) {
    setText(port->PortName, "50%s%n");
    EXPECT_EQ("50%s%n on Controller C0", name());
}

TEST_F(RenderPort, AMissingNameIsNoObstacle) {
    setText(port->PortName, nullptr);
    EXPECT_EQ("(null) on Controller C0", name());
    setText(port->PortName, "");
    EXPECT_EQ(" on Controller C0", name());
}

TEST_F(RenderPort, TheNameIsCutAt127Characters) {
    // " on Controller C0" takes 17 of them.
    setText(port->PortName, std::string(110, 'n').c_str());
    EXPECT_EQ(std::string(110, 'n') + " on Controller C0", name());
    setText(port->PortName, std::string(111, 'n').c_str());
    EXPECT_EQ(std::string(111, 'n') + " on Controller C", name());
    setText(port->PortName, std::string(65536, 'n').c_str());
    EXPECT_EQ(std::string(127, 'n'), name());
    EXPECT_EQ(std::string(127, 'n'), valueOf(rows(), "Caption"));
}

TEST_F(RenderPort, LogsNothing) {
    CapturedSyslog::clear();
    rows();
    EXPECT_TRUE(CapturedSyslog::lines().empty());
}

TEST_F(RenderPort, WithoutArraysEverythingElseIsSet) {
    EXPECT_EQ(withoutArrays(rows()), rowsWithoutArraysToHave(FillPortInstance, ctrl, port));
}

class RenderBattery : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        battery = attach(ctrl, newBattery("bbu0"));
        battery->OperationalStatus = 6;
        battery->BatteryStatus = 11;
    }
    std::vector<PropertyCall> rows() { return rowsOf(FillBatteryInstance, ctrl, battery); }
    std::string name() { return valueOf(rows(), "ElementName"); }

    RaidController_t* ctrl = nullptr;
    Battery_t* battery = nullptr;
};

TEST_F(RenderBattery, SetsEveryPropertyInOrder) {
    const std::vector<PropertyCall> expected = {
        charsRow("ElementName", "Battery bbu0 on Controller C0"),
        charsRow("Caption", "Battery bbu0 on Controller C0"),
        uint16ArrayRow("OperationalStatus", 6),
        uint16Row("HealthState", 30),
        uint16Row("BatteryStatus", 11),
    };
    EXPECT_EQ(expected, rows());
}

TEST_F(RenderBattery, HealthFollowsTheStatus) {
    for (CMPIUint16 status = 0; status < kStatuses; status++) {
        battery->OperationalStatus = status;
        EXPECT_EQ(std::to_string(kHealthByStatus[status]), valueOf(rows(), "HealthState"));
        EXPECT_EQ("uint16[1]{0:uint16 " + std::to_string(status) + "}",
                  valueOf(rows(), "OperationalStatus"));
    }
}

TEST_F(RenderBattery, LargeNumbersArePassedOn) {
    battery->OperationalStatus = 65535;
    battery->BatteryStatus = 65534;
    EXPECT_EQ("uint16[1]{0:uint16 65535}", valueOf(rows(), "OperationalStatus"));
    EXPECT_EQ("65534", valueOf(rows(), "BatteryStatus"));
}

TEST_F(RenderBattery, PercentSignsAreOnlyText) {
    setText(battery->DeviceID, "b%s%n");
    EXPECT_EQ("Battery b%s%n on Controller C0", name());
}

TEST_F(RenderBattery, MissingIdsAreNoObstacle) {
    setText(battery->DeviceID, nullptr);
    setText(ctrl->DeviceID, nullptr);
    EXPECT_EQ("Battery (null) on Controller (null)", name());
}

TEST_F(RenderBattery, TheNameIsCutAt127Characters) {
    // "Battery " and " on Controller C0" take 25 of them.
    setText(battery->DeviceID, std::string(102, 'b').c_str());
    EXPECT_EQ("Battery " + std::string(102, 'b') + " on Controller C0", name());
    setText(battery->DeviceID, std::string(103, 'b').c_str());
    EXPECT_EQ("Battery " + std::string(103, 'b') + " on Controller C", name());
    setText(battery->DeviceID, std::string(65536, 'b').c_str());
    EXPECT_EQ("Battery " + std::string(119, 'b'), name());
    EXPECT_EQ("Battery " + std::string(119, 'b'), valueOf(rows(), "Caption"));
}

TEST_F(RenderBattery, LogsNothing) {
    CapturedSyslog::clear();
    rows();
    EXPECT_TRUE(CapturedSyslog::lines().empty());
}

TEST_F(RenderBattery, WithoutArraysEverythingElseIsSet) {
    EXPECT_EQ(withoutArrays(rows()), rowsWithoutArraysToHave(FillBatteryInstance, ctrl, battery));
}

}  // namespace
}  // namespace plexortest
