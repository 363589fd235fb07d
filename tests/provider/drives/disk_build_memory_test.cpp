// Every allocation of a drive's build failing in turn.
#include "disk_fixture.h"

namespace plexortest {
namespace {

using testing::ElementsAre;
using testing::ElementsAreArray;
using testing::IsEmpty;

/// The allocations of a build in order, and what the failure of each leads to.
struct DiskAllocation {
    const char* label;
    std::size_t number;
    int result;
    std::vector<std::string> complaints;  ///< lines above debug that the failure causes
};

const DiskAllocation kDiskAllocations[] = {
    {"Record", 1, -2, {"ERR BuildDiskInfo, failed to allocate memory for DiskDrive_t\n"}},
    {"DeviceId", 2, -1, {"WARNING strdup() failed to duplicate string D1\n", "ERR NULL DeviceID"}},
    {"Name", 3, 0, {"WARNING strdup() failed to duplicate string Disk D1\n"}},
    {"Firmware", 4, 0, {"WARNING strdup() failed to duplicate string FW-D1\n"}},
    {"Chassis", 5, 0, {"WARNING strdup() failed to duplicate string C0_32\n"}},
    {"Pool", 6, -1, {"WARNING strdup() failed to duplicate string P1\n", "ERR No pool associated"}},
    {"Member", 7, 0, {"WARNING strdup() failed to duplicate string D1\n"}},
    {"MemberEntry", 8, 0, {}},
    {"ListEntry", 9, -2, {"ERR BuildDiskInfo: failed to add disk <?> to list <disks>, rc -2.\n"}},
};

class DiskBuildMemory : public DiskTest, public testing::WithParamInterface<DiskAllocation> {
protected:
    /// Warnings and errors, those with a path in them cut before it.
    Texts complaints() {
        Texts found;
        for (std::string line : logLines(names())) {
            if (line.starts_with("DEBUG") || line.starts_with("INFO")) continue;
            for (const char* suffix : {" for disk ", " with disk "})
                line = line.substr(0, line.find(suffix));
            found.push_back(line);
        }
        return found;
    }
};

TEST_P(DiskBuildMemory, HasThisOutcome) {
    const DiskAllocation& failing = GetParam();
    {
        const auto fault = FailAllocation::nth(failing.number);
        EXPECT_EQ(buildDisk(), failing.result);
        EXPECT_EQ(fault.failures(), 1u);
    }
    EXPECT_THAT(complaints(), ElementsAreArray(failing.complaints));
    EXPECT_EQ(logLines().back(),
              "DEBUG BuildDiskInfo, EXIT(" + std::to_string(failing.result) + ").\n");
    if (failing.result != 0) return expectNothingCached();

    const std::string label = failing.label;
    ASSERT_NE(disk(), nullptr);
    EXPECT_EQ(disk()->Name == nullptr, label == "Name");
    EXPECT_EQ(disk()->FwVersion == nullptr, label == "Firmware");
    EXPECT_EQ(disk()->Chassis == nullptr, label == "Chassis");
    EXPECT_STREQ(disk()->Pool, "P1");
    const bool listed = label != "Member" && label != "MemberEntry";
    EXPECT_EQ(members(pool_), listed ? Texts{"D1"} : Texts{});
    EXPECT_EQ(disk()->SlotNumber, 4);
}

INSTANTIATE_TEST_SUITE_P(Disk, DiskBuildMemory, testing::ValuesIn(kDiskAllocations),
                         [](const auto& given) { return given.param.label; });

class DiskBuildOutOfMemory : public DiskTest {
protected:
    /// A built drive or nothing at all, and no member without its record.
    void expectConsistent(int rc) {
        if (rc != 0) return expectNothingCached();
        ASSERT_NE(disk(), nullptr);
        EXPECT_THAT(members(pool_), testing::AnyOf(IsEmpty(), ElementsAre("D1")));
        ASSERT_EQ(DeleteDisk(ctrl, disk()), 0);
        EXPECT_THAT(members(pool_), IsEmpty());
    }
};

TEST_F(DiskBuildOutOfMemory, LeavesAConsistentInventoryAtEveryPoint) {
    const std::size_t allocations = forEachFailingAllocation([&](std::size_t n) {
        SCOPED_TRACE(n);
        ctrl->DiskUpdateTime = 0;
        expectConsistent(buildDisk());
        broker.flushThread();
    });
    EXPECT_EQ(allocations, std::size(kDiskAllocations));
}

TEST_F(DiskBuildOutOfMemory, OfTheRecordAsksNothing) {
    const auto fault = FailAllocation::nth(1);
    EXPECT_EQ(buildDisk(), -2);
    EXPECT_THAT(logLines(),
                ElementsAre("DEBUG BuildDiskInfo, ENTER...\n",
                            "ERR BuildDiskInfo, failed to allocate memory for DiskDrive_t\n",
                            "DEBUG BuildDiskInfo, EXIT(-2).\n"));
    EXPECT_THAT(brokerCalls(), IsEmpty());
}

TEST_F(DiskBuildOutOfMemory, OfTheDeviceIdComplainsTwice) {
    const auto fault = FailAllocation::strdupOf("D1");
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_THAT(logLines(),
                ElementsAre("DEBUG BuildDiskInfo, ENTER...\n",
                            "WARNING strdup() failed to duplicate string D1\n",
                            "ERR NULL DeviceID for disk " + kDrive + "\n", "DEBUG NULL deleted\n",
                            "DEBUG BuildDiskInfo, EXIT(-1).\n"));
}

TEST_F(DiskBuildOutOfMemory, OfTheListEntryWithdrawsTheDriveFromItsPool) {
    const auto fault = FailAllocation::nth(9);
    EXPECT_EQ(buildDisk(), -2);
    Texts lines = logLines(names());
    ASSERT_GE(lines.size(), 8u);
    lines.erase(lines.begin(), lines.end() - 8);
    EXPECT_THAT(lines,
                ElementsAre("DEBUG Data <?> added to the list <members>, size 1\n",
                            "DEBUG Adding data <?> to the list <disks> at the tail\n",
                            "ERR BuildDiskInfo: failed to add disk <?> to list <disks>, rc -2.\n",
                            "DEBUG BuildDiskInfo: remove disk D1 from pool <pool>\n",
                            "DEBUG Removing data <members> from list <?>\n",
                            "DEBUG Data <?> removed from list <members>, size 0\n",
                            "DEBUG Disk D1 deleted\n", "DEBUG BuildDiskInfo, EXIT(-2).\n"));
    expectNothingCached();
}

TEST_F(DiskBuildOutOfMemory, OfTheListEntryWithoutCachedPoolWithdrawsNothing) {
    repository.dissociate("Sample_ConcreteComponent", poolPath_, objects_.extent);
    vendor.tie("CIM_ConcreteComponent", vendor.pool(card, "unknown"), objects_.extent);
    const auto fault = FailAllocation::nth(7);
    EXPECT_EQ(buildDisk(), -2);
    EXPECT_EQ(CapturedSyslog::countContaining("failed to add disk"), 1u);
    EXPECT_EQ(CapturedSyslog::countContaining("remove disk"), 0u);
    expectNothingCached();
}

TEST_F(DiskBuildOutOfMemory, OfTheListEntryKeepsTheOtherDrives) {
    attach(ctrl, newDisk("D0", "P1"));
    addMember(pool_, "D0");
    const auto fault = FailAllocation::nth(9);
    EXPECT_EQ(buildDisk(), -2);
    EXPECT_EQ(ctrl->DiskList->Size, 1u);
    EXPECT_STREQ(disk()->DeviceID, "D0");
    EXPECT_THAT(members(pool_), ElementsAre("D0"));
}

}  // namespace
}  // namespace plexortest
