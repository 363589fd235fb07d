// What the build of a drive does with the controller's lock in hand, and what not.
#include "disk_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testing::ElementsAre;
using testing::IsEmpty;

class DiskBuildLock : public DiskTest {
protected:
    /// The last `count` lines of the log, with the state of the lock.
    Texts tail(std::size_t count) {
        Texts lines = logWithLock(names());
        EXPECT_GE(lines.size(), count);
        if (lines.size() > count)
            lines.erase(lines.begin(), lines.end() - static_cast<std::ptrdiff_t>(count));
        return lines;
    }
};

TEST_F(DiskBuildLock, IsFreeAtEveryQueryAndRead) {
    watchLock();
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_GT(watchedCalls_, 6);
    EXPECT_EQ(heldCalls_, 0);
    EXPECT_TRUE(isFree(ctrl->CtrlMutex));
}

TEST_F(DiskBuildLock, IsHeldFromThePoolsLookUpToTheInsertion) {
    watchLog();
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(
        tail(11),
        ElementsAre(testing::StartsWith("free INFO \nDiskOp: "),
                    "free DEBUG BuildDiskInfo, CIM Query - AssociatorNames: " + kExtent +
                        " (assocClass: CIM_Container, resultClass: CIM_Chassis)",
                    "held DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
                    "held DEBUG FindStoragePoolByID: found pool <pool> with P1 in list <pools>\n",
                    "held DEBUG BuildDiskInfo: found a pool <pool> with ID P1\n",
                    "held DEBUG Adding data <member> to the list <members> at the tail\n",
                    "held DEBUG Data <member> added to the list <members>, size 1\n",
                    "held DEBUG Adding data <disk> to the list <disks> at the tail\n",
                    "held DEBUG Data <disk> added to the list <disks>, size 1\n",
                    "held DEBUG BuildDiskInfo: disk <disk> added to the list <disks>\n",
                    "free DEBUG BuildDiskInfo, EXIT(0).\n"));
}

TEST_F(DiskBuildLock, IsHeldForAnInsertionWithoutCachedPool) {
    repository.dissociate("Sample_ConcreteComponent", poolPath_, objects_.extent);
    vendor.tie("CIM_ConcreteComponent", vendor.pool(card, "unknown"), objects_.extent);
    watchLog();
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(
        tail(6),
        ElementsAre("held DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
                    "held INFO FindStoragePoolByID: can not find pool unknown in list <pools>\n",
                    "held DEBUG Adding data <disk> to the list <disks> at the tail\n",
                    "held DEBUG Data <disk> added to the list <disks>, size 1\n",
                    "held DEBUG BuildDiskInfo: disk <disk> added to the list <disks>\n",
                    "free DEBUG BuildDiskInfo, EXIT(0).\n"));
}

TEST_F(DiskBuildLock, IsHeldForTheWithdrawalAndFreeForTheRelease) {
    watchLog();
    {
        const auto fault = FailAllocation::nth(9);
        EXPECT_EQ(buildDisk(), -2);
    }
    EXPECT_THAT(
        tail(6),
        ElementsAre("held ERR BuildDiskInfo: failed to add disk <?> to list <disks>, rc -2.\n",
                    "held DEBUG BuildDiskInfo: remove disk D1 from pool <pool>\n",
                    "held DEBUG Removing data <members> from list <?>\n",
                    "held DEBUG Data <?> removed from list <members>, size 0\n",
                    "free DEBUG Disk D1 deleted\n", "free DEBUG BuildDiskInfo, EXIT(-2).\n"));
}

TEST_F(DiskBuildLock, IsWaitedForBeforeThePoolIsJoined) {
    whileLockIsTaken(
        [&](const CMPIContext* context) {
            EXPECT_EQ(BuildDiskInfo(&mi, context, ctrl, instanceAt(objects_.drive),
                                    broker.makePath(objects_.drive)),
                      0);
        },
        [&] { return books().queries().size() == 6; },
        [&] {
            EXPECT_EQ(ctrl->DiskList->Size, 0u);
            EXPECT_EQ(ctrl->DiskUpdateTime, 0);
            EXPECT_THAT(members(pool_), IsEmpty());
            EXPECT_EQ(CapturedSyslog::countContaining("FindStoragePoolByID"), 0u);
        });
    EXPECT_EQ(ctrl->DiskList->Size, 1u);
    EXPECT_THAT(members(pool_), ElementsAre("D1"));
}

}  // namespace
}  // namespace plexortest
