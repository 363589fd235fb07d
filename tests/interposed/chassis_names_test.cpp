// Drives named by slot and enclosure, as soon as the look-up of a chassis gives one.
#include <cstring>
#include <string>
#include <vector>

#include "PlexorProviderIfc.h"
#include "owned_text.h"
#include "provider_fixture.h"
#include "render_recorder.h"

namespace {

/// Tags that were looked up, in order; "<null>" for none.
std::vector<std::string> askedTags;

}  // namespace

/// Finds the first chassis of the controller's list with that tag.
extern "C" Chassis_t* __wrap_FindChassisByTag(const RaidController_t* ctrl, const char* tag) {
    askedTags.push_back(tag != nullptr ? tag : "<null>");
    for (List_Entry_t* entry = ctrl->ChassisList->Head; entry != nullptr; entry = entry->Next) {
        auto* chassis = static_cast<Chassis_t*>(entry->Data);
        if (tag != nullptr && strcmp(chassis->Tag, tag) == 0) return chassis;
    }
    return nullptr;
}

namespace plexortest {
namespace {

class RenderChassis : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("0"));
        attach(ctrl, newChassis("ENC_32", "32"));
        attach(ctrl, newChassis("ENC_33", "33"));
        askedTags.clear();
    }
    DiskDrive_t* disk(const char* id, CMPIUint16 slot, const char* chassis) {
        DiskDrive_t* drive = attach(ctrl, newDisk(id, "pool1", chassis));
        drive->SlotNumber = slot;
        setText(drive->FwVersion, "GS0F");
        return drive;
    }
    StorageVolume_t* volume(std::initializer_list<const char*> members) {
        StoragePool_t* pool = attach(ctrl, newPool("pool1"));
        for (const char* member : members) addMember(pool, member);
        StorageVolume_t* made = attach(ctrl, newVolume("1", "pool1"));
        setText(made->ElementName, "data");
        return made;
    }
    std::string name(StorageVolume_t* record) {
        return valueOf(rowsOf(FillVolumeInstance, ctrl, record), "ElementName");
    }
    std::string name(DiskDrive_t* record) {
        return valueOf(rowsOf(FillExtentInstance, ctrl, record), "ElementName");
    }

    RaidController_t* ctrl = nullptr;
};

TEST_F(RenderChassis, AMemberIsNamedBySlotAndEnclosure) {
    disk("d4", 4, "ENC_32");
    EXPECT_EQ("RAID5 data Logical Volume 1 on controller 0, Drives(4e32) - OPTIMAL",
              name(volume({"d4"})));
}

TEST_F(RenderChassis, EveryMemberIsNamedByItsOwnEnclosure) {
    disk("a", 0, "ENC_32");
    disk("b", 1, "ENC_33");
    disk("c", 65535, "ENC_32");
    EXPECT_EQ("RAID5 data Logical Volume 1 on controller 0, Drives(0e32,1e33,65535e32) - OPTIMAL",
              name(volume({"a", "b", "c"})));
    const std::vector<std::string> tags = {"ENC_32", "ENC_33", "ENC_32"};
    EXPECT_EQ(tags, askedTags);
}

TEST_F(RenderChassis, AllMembersOfOneEnclosure) {
    disk("a", 0, "ENC_32");
    disk("b", 1, "ENC_32");
    disk("c", 2, "ENC_32");
    EXPECT_EQ("RAID5 data Logical Volume 1 on controller 0, Drives(0e32,1e32,2e32) - OPTIMAL",
              name(volume({"a", "b", "c"})));
}

TEST_F(RenderChassis, AMemberWithoutKnownEnclosureIsNamedByItsId) {
    disk("a", 0, "ENC_32");
    disk("b", 1, "ENC_32");
    disk("X", 2, "ENC_99");
    disk("Y", 3, nullptr);
    EXPECT_EQ("RAID5 data Logical Volume 1 on controller 0, Drives(0e32,1e32,X,Y) - OPTIMAL",
              name(volume({"a", "b", "X", "Y"})));
    const std::vector<std::string> tags = {"ENC_32", "ENC_32", "ENC_99", "<null>"};
    EXPECT_EQ(tags, askedTags);
}

TEST_F(RenderChassis, ADriveIsNamedBySlotAndEnclosure) {
    EXPECT_EQ("Drive 3 in enclosure 32 on controller 0 Fw: GS0F - ONLINE",
              name(disk("d3", 3, "ENC_32")));
    EXPECT_EQ("Drive 65535 in enclosure 33 on controller 0 Fw: GS0F - ONLINE",
              name(disk("d4", 65535, "ENC_33")));
    const std::vector<std::string> tags = {"ENC_32", "ENC_33"};
    EXPECT_EQ(tags, askedTags);
}

TEST_F(RenderChassis, ADriveWithoutKnownEnclosureIsNamedByItsId) {
    EXPECT_EQ("Drive X on controller 0 Fw: GS0F - ONLINE", name(disk("X", 3, "ENC_99")));
    EXPECT_EQ("Drive Y on controller 0 Fw: GS0F - ONLINE", name(disk("Y", 3, nullptr)));
}

TEST_F(RenderChassis, AnEnclosureWithoutInternalTagIsNoObstacle) {
    attach(ctrl, newChassis("ENC_34"));
    EXPECT_EQ("Drive 3 in enclosure (null) on controller 0 Fw: GS0F - ONLINE",
              name(disk("d3", 3, "ENC_34")));
    EXPECT_EQ("RAID5 data Logical Volume 1 on controller 0, Drives(3e(null)) - OPTIMAL",
              name(volume({"d3"})));
}

TEST_F(RenderChassis, PercentSignsAreOnlyText) {
    attach(ctrl, newChassis("ENC%s", "%n%s"));
    DiskDrive_t* drive = disk("d3", 3, "ENC%s");
    EXPECT_EQ("Drive 3 in enclosure %n%s on controller 0 Fw: GS0F - ONLINE", name(drive));
    EXPECT_EQ("RAID5 data Logical Volume 1 on controller 0, Drives(3e%n%s) - OPTIMAL",
              name(volume({"d3"})));
}

TEST_F(RenderChassis, NamesAreCutAllTheSame) {
    attach(ctrl, newChassis("big", std::string(65536, 'e').c_str()));
    EXPECT_EQ("Drive 3 in enclosure " + std::string(106, 'e'), name(disk("d3", 3, "big")));
    EXPECT_EQ("RAID5 data Logical Volume 1 on controller 0, Drives(3e" + std::string(457, 'e'),
              name(volume({"d3"})));
}

}  // namespace
}  // namespace plexortest
