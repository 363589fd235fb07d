// What a client sees of a controller's firmware package.
#include <string>

#include "PlexorProviderIfc.h"
#include "owned_text.h"
#include "provider_fixture.h"
#include "render_recorder.h"

namespace plexortest {
namespace {

class RenderSoftwareIdentity : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        setText(ctrl->Model, "SC-9300");
        setVersions("4.2.1", "23.9.0");
    }
    void setVersions(const char* bundle, const char* firmware) {
        setText(ctrl->BundleVersion, bundle);
        setText(ctrl->FirmwareVersion, firmware);
    }
    std::vector<PropertyCall> rows() { return rowsOf(FillSoftwareIdentityInstance, ctrl); }
    std::string version() { return valueOf(rows(), "VersionString"); }

    RaidController_t* ctrl = nullptr;
};

TEST_F(RenderSoftwareIdentity, SetsEveryPropertyInOrder) {
    const std::vector<PropertyCall> expected = {
        booleanRow("IsEntity", true),
        charsRow("VersionString", "4.2.1 (Package); 23.9.0 (Fw)"),
        charsRow("ElementName", "Controller C0 (SC-9300)"),
        charsRow("Caption", "Controller C0 (SC-9300)"),
    };
    EXPECT_EQ(expected, rows());
}

TEST_F(RenderSoftwareIdentity, AMissingVersionReadsNotAvailable) {
    setVersions(nullptr, "23.9.0");
    EXPECT_EQ("n/a (Package); 23.9.0 (Fw)", version());
    setVersions("", "23.9.0");
    EXPECT_EQ("n/a (Package); 23.9.0 (Fw)", version());
    setVersions("4.2.1", nullptr);
    EXPECT_EQ("4.2.1 (Package); n/a (Fw)", version());
    setVersions("4.2.1", "");
    EXPECT_EQ("4.2.1 (Package); n/a (Fw)", version());
    setVersions(nullptr, "");
    EXPECT_EQ("n/a (Package); n/a (Fw)", version());
}

TEST_F(RenderSoftwareIdentity, OtherVersionsOfTheControllerStayOut) {
    setText(ctrl->BiosVersion, "B7");
    setText(ctrl->DriverVersion, "D7");
    EXPECT_EQ("4.2.1 (Package); 23.9.0 (Fw)", version());
}

TEST_F(RenderSoftwareIdentity, EnterAndExitAreLogged) {
    CapturedSyslog::clear();
    rows();
    const std::vector<LogLine> lines = CapturedSyslog::lines();
    ASSERT_EQ(2u, lines.size());
    EXPECT_EQ(LOG_DEBUG, lines[0].priority);
    EXPECT_EQ("FillSoftwareIdentityInstance(ENTER): ID C0\n", lines[0].text);
    EXPECT_EQ(LOG_DEBUG, lines[1].priority);
    EXPECT_EQ("FillSoftwareIdentityInstance(EXIT)\n", lines[1].text);
}

TEST_F(RenderSoftwareIdentity, PercentSignsAreOnlyText) {
    setVersions("4%s", "%n23");
    EXPECT_EQ("4%s (Package); %n23 (Fw)", version());
}

TEST_F(RenderSoftwareIdentity, VersionsAreCutAt127Characters) {
    // " (Package); " and " (Fw)" take 17 of them, the firmware's version 6.
    setVersions(std::string(104, 'p').c_str(), "23.9.0");
    EXPECT_EQ(std::string(104, 'p') + " (Package); 23.9.0 (Fw)", version());
    setVersions(std::string(105, 'p').c_str(), "23.9.0");
    EXPECT_EQ(std::string(105, 'p') + " (Package); 23.9.0 (Fw", version());
    setVersions(std::string(120, 'p').c_str(), "23.9.0");
    EXPECT_EQ(std::string(120, 'p') + " (Packa", version());
    setVersions(std::string(65536, 'p').c_str(), std::string(65536, 'f').c_str());
    EXPECT_EQ(std::string(127, 'p'), version());
    setVersions("4.2.1", std::string(65536, 'f').c_str());
    EXPECT_EQ("4.2.1 (Package); " + std::string(110, 'f'), version());
}

TEST_F(RenderSoftwareIdentity, TheNameIsCutAt127Characters) {
    setText(ctrl->Model, std::string(65536, 'm').c_str());
    const std::vector<PropertyCall> set = rows();
    EXPECT_EQ("Controller C0 (" + std::string(112, 'm'), valueOf(set, "ElementName"));
    EXPECT_EQ("Controller C0 (" + std::string(112, 'm'), valueOf(set, "Caption"));
}

TEST_F(RenderSoftwareIdentity, AMissingModelIsNoObstacle) {
    setText(ctrl->Model, nullptr);
    EXPECT_EQ("Controller C0 ((null))", valueOf(rows(), "ElementName"));
}

}  // namespace
}  // namespace plexortest
