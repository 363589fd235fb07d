// What the building of the controllers leaves in the log.
#include "controller_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;

const LogLine kBuildEnter = debugLine("BuildControllerInfo, enter...\n");
const LogLine kBuildExit = debugLine("BuildControllerInfo, EXIT(0).\n");

class ControllerLog : public ControllerTest {
protected:
    static LogLine query(const Path& path, const std::string& classes) {
        return debugLine("BuildControllerInfo, CIM Query - Associators: " + path.text() + " " +
                         classes);
    }
    static LogLine profileQuery(const Path& profile) {
        return query(profile,
                     "(assocClass: CIM_ElementConformsToProfile, resultClass: CIM_PortController)");
    }
    static LogLine systemQuery(const Path& port) {
        return query(port, "(assocClass: CIM_LogicalIdentity, resultClass: CIM_ComputerSystem)");
    }
    static LogLine packageQuery(const Path& port) {
        return query(port, "(assocClass: CIM_Realizes, resultClass: CIM_PhysicalPackage)");
    }
    static LogLine softwareQuery(const Path& system) {
        return query(
            system, "(assocClass: CIM_ElementSoftwareIdentity, resultClass: CIM_SoftwareIdentity)");
    }
};

TEST_F(ControllerLog, NoProfile) {
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(inventoryLog(), ElementsAre(kBuildEnter, kBuildExit));
}

TEST_F(ControllerLog, CompleteController) {
    const Path profile = addProfile();
    const VendorController card = addFullController(profile, "C0");
    set(card.package, "HealthState", CimValue::uint16(20));
    ASSERT_EQ(build(), 0);
    const std::string port = card.port.text();
    EXPECT_THAT(
        inventoryLog(),
        ElementsAre(
            kBuildEnter, profileQuery(profile), systemQuery(card.port),
            debugLine("PortController: " + port + "\n"), packageQuery(card.port),
            softwareQuery(card.system),
            debugLine("BuildControllerInfo: ctrl C0, swClass 10, versionStr FW-C0\n"),
            debugLine("BuildControllerInfo: ctrl C0, swClass 11, versionStr BIOS-C0\n"),
            debugLine("BuildControllerInfo: ctrl C0, swClass 2, versionStr DRV-C0\n"),
            debugLine("BuildControllerInfo: ctrl C0, swClass 13, versionStr PKG-C0\n"),
            infoLine("\nPortControllerOp: " + port + "\nControllerOp:     " + card.system.text() +
                     "\n\tDeviceID          - C0\n"
                     "\tModel             - Model C0\n"
                     "\tFirmwareVersion   - FW-C0\n"
                     "\tBiosVersion       - BIOS-C0\n"
                     "\tDriverVersion     - DRV-C0\n"
                     "\tBundleVersion     - PKG-C0\n"
                     "\tHealthState       - 20\n"
                     "\tOperationalStatus - 2\n"),
            debugLine(formatted("BuildControllerInfo: controller %p added to the list\n",
                                static_cast<void*>(controllers()[0]))),
            kBuildExit));
}

TEST_F(ControllerLog, BareControllerIsStillDumped) {
    const VendorController card = vendor.controller("C0", addProfile());
    ASSERT_TRUE(repository.remove(card.package));
    ASSERT_EQ(build(), 0);
    ASSERT_EQ(CapturedSyslog::linesAt(LOG_INFO).size(), 1u);
    const std::string dump = CapturedSyslog::linesAt(LOG_INFO)[0];
    EXPECT_THAT(dump, testing::HasSubstr("\n\tDeviceID          - C0\n\tModel             - "));
    EXPECT_THAT(dump, testing::EndsWith("\n\tHealthState       - 0\n\tOperationalStatus - 2\n"));
}

TEST_F(ControllerLog, ControllerWithoutDeviceId) {
    const Path profile = addProfile();
    const VendorController card = addFullController(profile, "C0");
    unset(card.port, "DeviceID");
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(
        inventoryLog(),
        ElementsAre(kBuildEnter, profileQuery(profile),
                    errorLine("NULL DeviceID for PortController: " + card.port.text() + "\n"),
                    kBuildExit));
}

TEST_F(ControllerLog, ControllerWithoutDeviceIdAndPath) {
    const Path profile = addProfile();
    const VendorController card = addFullController(profile, "C0");
    unset(card.port, "DeviceID");
    failOnly(answerNull(Entry::Clone));
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(inventoryLog(),
                ElementsAre(kBuildEnter, profileQuery(profile),
                            errorLine("NULL DeviceID for PortController: NULL\n"), kBuildExit));
}

TEST_F(ControllerLog, ControllerWithoutSystem) {
    const Path profile = addProfile();
    const VendorController card = addFullController(profile, "C0");
    ASSERT_TRUE(repository.remove(card.system));
    ASSERT_EQ(build(), 0);
    EXPECT_THAT(inventoryLog(),
                ElementsAre(kBuildEnter, profileQuery(profile), systemQuery(card.port),
                            debugLine("PortController: " + card.port.text() + "\n"), kBuildExit));
}

TEST_F(ControllerLog, VendorsTextsAreNoFormats) {
    const VendorController card = addFullController(addProfile(), "C%s%n");
    set(card.package, "Model", CimValue::string("%d%s%n"));
    ASSERT_EQ(build(), 0);
    EXPECT_STREQ(controllers()[0]->DeviceID, "C%s%n");
    EXPECT_TRUE(
        logged(LOG_DEBUG, "BuildControllerInfo: ctrl C%s%n, swClass 10, versionStr FW-C%s%n\n"));
    EXPECT_EQ(CapturedSyslog::countContaining(
                  "\n\tDeviceID          - C%s%n\n\tModel             - %d%s%n\n"),
              1u);
}

TEST_F(ControllerLog, MaskedLinesCostNoCallForTheirTexts) {
    addFullController(addProfile(), "C0");
    books().recordObjectCalls(true);
    setlogmask(LOG_UPTO(LOG_ERR));
    ASSERT_EQ(build(), 0);
    EXPECT_EQ(books().count(Entry::PathToString), 0u);
}

}  // namespace
}  // namespace plexortest
