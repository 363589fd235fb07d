// How a logical volume's name is composed.
#include "render_volume_fixture.h"

namespace plexortest {
namespace {

class RenderVolumeName : public RenderVolumeTest {
protected:
    /// The name, which is the caption too.
    std::string name() {
        const std::vector<PropertyCall> set = rows();
        EXPECT_EQ(valueOf(set, "ElementName"), valueOf(set, "Caption"));
        return valueOf(set, "ElementName");
    }
};

TEST_F(RenderVolumeName, RaidLevelAndElementNameComeFirstWhenKnown) {
    givePool({"d1"});
    const std::string rest = "Logical Volume 1 on controller C0, Drives(d1) - OPTIMAL";
    setText(volume->RaidLevel, nullptr);
    setText(volume->ElementName, nullptr);
    EXPECT_EQ(rest, name());
    setText(volume->RaidLevel, "");
    setText(volume->ElementName, "");
    EXPECT_EQ(rest, name());
    setText(volume->RaidLevel, "RAID5");
    EXPECT_EQ("RAID5 " + rest, name());
    setText(volume->ElementName, "data");
    EXPECT_EQ("RAID5 data " + rest, name());
    setText(volume->RaidLevel, "");
    EXPECT_EQ("data " + rest, name());
    setText(volume->RaidLevel, "5");
    setText(volume->ElementName, "d");
    EXPECT_EQ("5 d " + rest, name());
}

TEST_F(RenderVolumeName, EndsWithTheState) {
    givePool({"d1"});
    const std::string start = "Logical Volume 1 on controller C0, Drives(d1)";
    for (CMPIUint16 status = 0; status <= 19; status++) {
        volume->OperationalStatus = status;
        const char* suffix = status == 2   ? " - OPTIMAL"
                             : status == 3 ? " - DEGRADED"
                             : status == 6 ? " - OFFLINE"
                                           : " - UNDEFINED";
        EXPECT_EQ(start + suffix, name()) << "status " << status;
    }
    volume->OperationalStatus = 65535;
    EXPECT_EQ(start + " - UNDEFINED", name());
}

TEST_F(RenderVolumeName, ListsTheMembersInThePoolsOrder) {
    givePool({"d2", "d10", "d1"});
    EXPECT_EQ("Logical Volume 1 on controller C0, Drives(d2,d10,d1) - OPTIMAL", name());
}

TEST_F(RenderVolumeName, OnlyThePoolsOwnMembersAreListed) {
    givePool({"d1", "d2"});
    attach(ctrl, newDisk("d3"));
    addMember(attach(ctrl, newPool("pool2")), "d3");
    EXPECT_EQ("Logical Volume 1 on controller C0, Drives(d1,d2) - OPTIMAL", name());
}

TEST_F(RenderVolumeName, MembersAreNamedByIdAlsoInAKnownEnclosure) {
    attach(ctrl, newChassis("C0_32", "32"));
    attach(ctrl, newDisk("d4", nullptr, "C0_32"))->SlotNumber = 4;
    addMember(givePool({}), "d4");
    EXPECT_EQ("Logical Volume 1 on controller C0, Drives(d4) - OPTIMAL", name());
}

TEST_F(RenderVolumeName, OfAPoolWithoutMembersLeavesTheParenthesisOpen) {
    givePool({});
    CapturedSyslog::clear();
    EXPECT_EQ("Logical Volume 1 on controller C0, Drives( - OPTIMAL", name());
    EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
}

TEST_F(RenderVolumeName, WithoutPoolLacksTheDrives) {
    attach(ctrl, newPool("pool1"));
    const std::vector<std::string> error = {
        "FillVolumeInstance: Cannot get physical drive info for logical volume 1\n"};
    for (const char* pool : {static_cast<const char*>(nullptr), "", "pool2", "POOL1"}) {
        setText(volume->FromPool, pool);
        CapturedSyslog::clear();
        EXPECT_EQ("Logical Volume 1 on controller C0 - OPTIMAL", name());
        EXPECT_EQ(error, CapturedSyslog::linesAt(LOG_ERR));
    }
}

TEST_F(RenderVolumeName, OfAPoolWithoutDriveListLacksTheDrives) {
    StoragePool_t* pool = givePool({});
    pool->Drives = nullptr;
    CapturedSyslog::clear();
    EXPECT_EQ("Logical Volume 1 on controller C0 - OPTIMAL", name());
    const std::vector<std::string> error = {
        "FillVolumeInstance: Cannot get physical drive info for logical volume 1\n"};
    EXPECT_EQ(error, CapturedSyslog::linesAt(LOG_ERR));
    pool->Drives = &pool->_Drives;
}

TEST_F(RenderVolumeName, PercentSignsAreOnlyText) {
    givePool({"d%s%n"});
    setText(volume->RaidLevel, "RAID%d");
    setText(volume->ElementName, "100%");
    setText(volume->DeviceID, "%s");
    setText(ctrl->DeviceID, "%n%n");
    EXPECT_EQ("RAID%d 100% Logical Volume %s on controller %n%n, Drives(d%s%n) - OPTIMAL", name());
    setText(volume->FromPool, nullptr);
    CapturedSyslog::clear();
    EXPECT_EQ("RAID%d 100% Logical Volume %s on controller %n%n - OPTIMAL", name());
    EXPECT_TRUE(logged(LOG_ERR,
                       "FillVolumeInstance: Cannot get physical drive info for logical "
                       "volume %s\n"));
}

TEST_F(RenderVolumeName, MissingIdsAreNoObstacle) {
    givePool({"d1"});
    setText(volume->DeviceID, nullptr);
    setText(ctrl->DeviceID, nullptr);
    EXPECT_EQ("Logical Volume (null) on controller (null), Drives(d1) - OPTIMAL", name());
}

TEST_F(RenderVolumeName, IsCutAt511Characters) {
    givePool({"d1"});
    // The ElementName's blank and the rest take 56 of them.
    const std::string rest = " Logical Volume 1 on controller C0, Drives(d1) - OPTIMAL";
    setText(volume->ElementName, std::string(455, 'e').c_str());
    EXPECT_EQ(std::string(455, 'e') + rest, name());
    setText(volume->ElementName, std::string(456, 'e').c_str());
    EXPECT_EQ(std::string(456, 'e') + rest.substr(0, 55), name());
    setText(volume->ElementName, std::string(470, 'e').c_str());
    EXPECT_EQ(std::string(470, 'e') + rest.substr(0, 41), name());
    setText(volume->ElementName, std::string(510, 'e').c_str());
    EXPECT_EQ(std::string(510, 'e') + " ", name());
    setText(volume->ElementName, std::string(511, 'e').c_str());
    EXPECT_EQ(std::string(511, 'e'), name());
    setText(volume->ElementName, std::string(65536, 'e').c_str());
    EXPECT_EQ(std::string(511, 'e'), name());
}

TEST_F(RenderVolumeName, IsCutInTheMiddleOfManyMembers) {
    StoragePool_t* pool = givePool({});
    std::string whole = "Logical Volume 1 on controller C0, Drives(";
    for (int i = 100; i < 340; i++) {
        const std::string id = "disk" + std::to_string(i);
        attach(ctrl, newDisk(id.c_str()));
        addMember(pool, id.c_str());
        whole += id + ",";
    }
    EXPECT_EQ(whole.substr(0, 511), name());
}

TEST_F(RenderVolumeName, ACutNameStillTellsTheHealth) {
    setText(volume->RaidLevel, std::string(65536, 'r').c_str());
    volume->OperationalStatus = 6;
    const std::vector<PropertyCall> rows = rowsOf(FillVolumeInstance, ctrl, volume);
    EXPECT_EQ(std::string(511, 'r'), valueOf(rows, "ElementName"));
    EXPECT_EQ("30", valueOf(rows, "HealthState"));
    EXPECT_EQ(16u, rows.size());
}

}  // namespace
}  // namespace plexortest
