// What a client sees of a physical drive.
#include <string>

#include "PlexorProviderIfc.h"
#include "owned_text.h"
#include "provider_fixture.h"
#include "render_recorder.h"

namespace plexortest {
namespace {

class RenderExtent : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        disk = attach(ctrl, newDisk("d7"));
        setText(disk->FwVersion, "GS0F");
        disk->OperationalStatus = 2;
        disk->ExtentStatus = 2;
        disk->NumberOfBlocks = 1172123568;
    }
    std::vector<PropertyCall> rows() { return rowsOf(FillExtentInstance, ctrl, disk); }
    std::string name() { return valueOf(rows(), "ElementName"); }

    RaidController_t* ctrl = nullptr;
    DiskDrive_t* disk = nullptr;
};

TEST_F(RenderExtent, SetsEveryPropertyInOrder) {
    const std::vector<PropertyCall> expected = {
        charsRow("ElementName", "Drive d7 on controller C0 Fw: GS0F - ONLINE"),
        charsRow("Caption", "Drive d7 on controller C0 Fw: GS0F - ONLINE"),
        uint16ArrayRow("OperationalStatus", 2),
        uint16Row("HealthState", 5),
        uint16Row("BlockSize", 512),
        uint64Row("NumberOfBlocks", 1172123568),
        booleanRow("Primordial", false),
    };
    EXPECT_EQ(expected, rows());
}

TEST_F(RenderExtent, PrimordialIsTheDrivesOwnThoughThePoolDecidesOnTheWord) {
    attach(ctrl, newPool("pool0"))->Primordial = 1;
    setText(disk->Pool, "pool0");
    disk->Primordial = 0;
    EXPECT_EQ("Drive d7 on controller C0 Fw: GS0F - UNCONFIGURED GOOD", name());
    EXPECT_EQ("false", valueOf(rows(), "Primordial"));

    attach(ctrl, newPool("pool1"))->Primordial = 0;
    setText(disk->Pool, "pool1");
    disk->Primordial = 1;
    EXPECT_EQ("Drive d7 on controller C0 Fw: GS0F - ONLINE", name());
    EXPECT_EQ("true", valueOf(rows(), "Primordial"));
}

TEST_F(RenderExtent, HealthAndWordTellTheCondition) {
    disk->OperationalStatus = 6;
    EXPECT_EQ("Drive d7 on controller C0 Fw: GS0F - FAILED", name());
    EXPECT_EQ("30", valueOf(rows(), "HealthState"));
    EXPECT_EQ("uint16[1]{0:uint16 6}", valueOf(rows(), "OperationalStatus"));

    disk->Primordial = 1;
    EXPECT_EQ("Drive d7 on controller C0 Fw: GS0F - UNCONFIGURED BAD", name());
    EXPECT_EQ("10", valueOf(rows(), "HealthState"));

    disk->OperationalStatus = 12;
    EXPECT_EQ("Drive d7 on controller C0 Fw: GS0F - OFFLINE", name());
    EXPECT_EQ("20", valueOf(rows(), "HealthState"));

    disk->OperationalStatus = 65535;
    EXPECT_EQ("Drive d7 on controller C0 Fw: GS0F - UNDEFINED", name());
    EXPECT_EQ("10", valueOf(rows(), "HealthState"));
    EXPECT_EQ("uint16[1]{0:uint16 65535}", valueOf(rows(), "OperationalStatus"));
}

TEST_F(RenderExtent, AMissingFirmwareVersionReadsNotAvailable) {
    setText(disk->FwVersion, nullptr);
    EXPECT_EQ("Drive d7 on controller C0 Fw: n/a - ONLINE", name());
    setText(disk->FwVersion, "");
    EXPECT_EQ("Drive d7 on controller C0 Fw: n/a - ONLINE", name());
}

TEST_F(RenderExtent, IsNamedByItsIdAlsoInAKnownEnclosure) {
    attach(ctrl, newChassis("C0_32", "32"));
    setText(disk->Chassis, "C0_32");
    disk->SlotNumber = 3;
    CapturedSyslog::clear();
    EXPECT_EQ("Drive d7 on controller C0 Fw: GS0F - ONLINE", name());
    EXPECT_EQ(1u, CapturedSyslog::countContaining("FindChassisByTag: found chassis"));
}

TEST_F(RenderExtent, ItsEnclosureIsLookedUpBeforeItsPool) {
    attach(ctrl, newChassis("C0_32", "32"));
    attach(ctrl, newPool("pool0"));
    setText(disk->Chassis, "C0_32");
    setText(disk->Pool, "pool0");
    CapturedSyslog::clear();
    rows();
    std::vector<std::string> lookUps;
    for (const LogLine& line : CapturedSyslog::lines()) {
        const std::string function = line.text.substr(0, line.text.find(':'));
        if (lookUps.empty() || lookUps.back() != function) lookUps.push_back(function);
    }
    EXPECT_EQ(lookUps, (std::vector<std::string>{"FindChassisByTag", "FindStoragePoolByID"}));
}

TEST_F(RenderExtent, ManyBlocksAreCounted) {
    disk->NumberOfBlocks = 0xFFFFFFFFFFFFFFFFu;
    EXPECT_EQ("18446744073709551615", valueOf(rows(), "NumberOfBlocks"));
    disk->NumberOfBlocks = 0;
    disk->ConsumableBlocks = 5;
    EXPECT_EQ("0", valueOf(rows(), "NumberOfBlocks"));
}

TEST_F(RenderExtent, PercentSignsAreOnlyText) {
    setText(disk->DeviceID, "d%s");
    setText(ctrl->DeviceID, "%nC");
    setText(disk->FwVersion, "%d%%");
    EXPECT_EQ("Drive d%s on controller %nC Fw: %d%% - ONLINE", name());
}

TEST_F(RenderExtent, MissingIdsAreNoObstacle) {
    setText(disk->DeviceID, nullptr);
    setText(ctrl->DeviceID, nullptr);
    EXPECT_EQ("Drive (null) on controller (null) Fw: GS0F - ONLINE", name());
}

TEST_F(RenderExtent, TheNameIsCutAt127Characters) {
    // "Drive ", " on controller C0 Fw: GS0F" and " - ONLINE" take 41 of them.
    const std::string end = " on controller C0 Fw: GS0F - ONLINE";
    setText(disk->DeviceID, std::string(86, 'd').c_str());
    EXPECT_EQ("Drive " + std::string(86, 'd') + end, name());
    setText(disk->DeviceID, std::string(87, 'd').c_str());
    EXPECT_EQ("Drive " + std::string(87, 'd') + " on controller C0 Fw: GS0F - ONLIN", name());
    setText(disk->DeviceID, std::string(118, 'd').c_str());
    EXPECT_EQ("Drive " + std::string(118, 'd') + " on", name());
    setText(disk->DeviceID, std::string(65536, 'd').c_str());
    EXPECT_EQ("Drive " + std::string(121, 'd'), name());
    EXPECT_EQ("Drive " + std::string(121, 'd'), valueOf(rows(), "Caption"));
}

TEST_F(RenderExtent, ACutNameChangesNothingElse) {
    setText(disk->FwVersion, std::string(65536, 'f').c_str());
    EXPECT_EQ("Drive d7 on controller C0 Fw: " + std::string(97, 'f'), name());
    EXPECT_EQ("5", valueOf(rows(), "HealthState"));
}

TEST_F(RenderExtent, LogsNothingOfItsOwn) {
    CapturedSyslog::clear();
    rows();
    EXPECT_EQ(0u, CapturedSyslog::countContaining("FillExtentInstance"));
    EXPECT_EQ(0u, CapturedSyslog::countContaining("GetDiskPhysicalStatus"));
    EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
}

TEST_F(RenderExtent, WithoutArraysEverythingElseIsSet) {
    EXPECT_EQ(withoutArrays(rows()), rowsWithoutArraysToHave(FillExtentInstance, ctrl, disk));
}

}  // namespace
}  // namespace plexortest
