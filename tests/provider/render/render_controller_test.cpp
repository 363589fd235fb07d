// What a client sees of a controller.
#include <string>

#include "PlexorProviderIfc.h"
#include "owned_text.h"
#include "provider_fixture.h"
#include "render_recorder.h"

namespace plexortest {
namespace {

class RenderController : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        setText(ctrl->Model, "SC-9300");
        ctrl->OperationalStatus = 2;
    }
    std::vector<PropertyCall> rows() { return rowsOf(FillControllerInstance, ctrl); }
    std::string name() { return valueOf(rows(), "ElementName"); }

    RaidController_t* ctrl = nullptr;
};

TEST_F(RenderController, SetsEveryPropertyInOrder) {
    const std::vector<PropertyCall> expected = {
        charsRow("ElementName", "Controller C0 (SC-9300)"),
        charsRow("Caption", "Controller C0 (SC-9300)"),
        uint16ArrayRow("OperationalStatus", 2),
        uint16Row("HealthState", 5),
        charsArrayRow("IdentifyingDescriptions", "Serial Number"),
        charsArrayRow("OtherIdentifyingInfo", "C0"),
        uint16ArrayRow("Dedicated", 3),
        charsRow("NameFormat", "Other"),
    };
    EXPECT_EQ(expected, rows());
}

TEST_F(RenderController, AFailedControllerStillReportsHealth5) {
    ctrl->OperationalStatus = 6;
    ctrl->HealthState = 30;
    EXPECT_EQ("uint16[1]{0:uint16 6}", valueOf(rows(), "OperationalStatus"));
    EXPECT_EQ("5", valueOf(rows(), "HealthState"));
}

TEST_F(RenderController, TheStatusIsPassedOnWhateverItIs) {
    for (const unsigned status : {0u, 18u, 32768u, 65535u}) {
        ctrl->OperationalStatus = static_cast<CMPIUint16>(status);
        EXPECT_EQ("uint16[1]{0:uint16 " + std::to_string(status) + "}",
                  valueOf(rows(), "OperationalStatus"));
    }
}

TEST_F(RenderController, EnterAndExitAreLogged) {
    CapturedSyslog::clear();
    rows();
    const std::vector<LogLine> lines = CapturedSyslog::lines();
    ASSERT_EQ(2u, lines.size());
    EXPECT_EQ(LOG_DEBUG, lines[0].priority);
    EXPECT_EQ("FillControllerInstance(ENTER): ID C0\n", lines[0].text);
    EXPECT_EQ(LOG_DEBUG, lines[1].priority);
    EXPECT_EQ("FillControllerInstance(EXIT)\n", lines[1].text);
}

TEST_F(RenderController, PercentSignsAreOnlyText) {
    setText(ctrl->DeviceID, "%s%n");
    setText(ctrl->Model, "100%d %x");
    EXPECT_EQ("Controller %s%n (100%d %x)", name());
    EXPECT_EQ("string[1]{0:chars %s%n}", valueOf(rows(), "OtherIdentifyingInfo"));
    EXPECT_LT(0u, CapturedSyslog::count("FillControllerInstance(ENTER): ID %s%n\n"));
}

TEST_F(RenderController, AMissingModelOrIdIsNoObstacle) {
    setText(ctrl->Model, nullptr);
    EXPECT_EQ("Controller C0 ((null))", name());
    setText(ctrl->DeviceID, nullptr);
    EXPECT_EQ("Controller (null) ((null))", name());
    EXPECT_EQ("string[1]{0:chars <null>}", valueOf(rows(), "OtherIdentifyingInfo"));
    EXPECT_EQ("Other", valueOf(rows(), "NameFormat"));
}

TEST_F(RenderController, TheNameIsCutAt127Characters) {
    // "Controller C0 (" and ")" leave room for 111 characters.
    setText(ctrl->Model, std::string(111, 'm').c_str());
    EXPECT_EQ("Controller C0 (" + std::string(111, 'm') + ")", name());
    setText(ctrl->Model, std::string(112, 'm').c_str());
    EXPECT_EQ("Controller C0 (" + std::string(112, 'm'), name());
    setText(ctrl->Model, std::string(65536, 'm').c_str());
    EXPECT_EQ("Controller C0 (" + std::string(112, 'm'), name());
    EXPECT_EQ("Controller C0 (" + std::string(112, 'm'), valueOf(rows(), "Caption"));
}

TEST_F(RenderController, ALongIdIsCutInTheNameOnly) {
    const std::string id(65536, 'x');
    setText(ctrl->DeviceID, id.c_str());
    EXPECT_EQ("Controller " + std::string(116, 'x'), name());
    EXPECT_EQ("string[1]{0:chars " + id + "}", valueOf(rows(), "OtherIdentifyingInfo"));
}

TEST_F(RenderController, WithoutArraysEverythingElseIsSet) {
    EXPECT_EQ(withoutArrays(rows()), rowsWithoutArraysToHave(FillControllerInstance, ctrl));
}

}  // namespace
}  // namespace plexortest
