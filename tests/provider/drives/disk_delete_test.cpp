// Deleting a drive: its pool forgets it too.
#include <errno.h>

#include "provider_fixture.h"

namespace plexortest {
namespace {

class DiskDelete : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        ctrl = attach(newController("C0"));
        pool = attach(ctrl, newPool("P0"));
    }

    static std::vector<std::string> members(const StoragePool_t* of) {
        std::vector<std::string> names;
        for (const List_Entry_t* entry = of->_Drives.Head; entry != nullptr; entry = entry->Next) {
            names.push_back(static_cast<const char*>(entry->Data));
        }
        return names;
    }

    RaidController_t* ctrl = nullptr;
    StoragePool_t* pool = nullptr;
    const std::string kFromController = "Disk D0 removed from controller C0(Model C0)\n";
    const std::string kFromPool = "Disk D0 removed from pool P0\n";
};

TEST_F(DiskDelete, OnlyDiskOfAPoolLeavesThePool) {
    DiskDrive_t* disk = attach(ctrl, newDisk("D0", "P0"));
    addMember(pool, "D0");
    EXPECT_EQ(DeleteDisk(ctrl, disk), 0);
    EXPECT_EQ(ctrl->DiskList->Size, 0u);
    EXPECT_EQ(members(pool), std::vector<std::string>{});
    EXPECT_EQ(pool->_Drives.Size, 0u);
    ASSERT_EQ(ctrl->PoolList->Size, 1u);
    EXPECT_EQ(ctrl->PoolList->Head->Data, pool);
}

TEST_F(DiskDelete, OtherMembersStay) {
    for (const char* id : {"D1", "D0", "D2"}) addMember(pool, id);
    EXPECT_EQ(DeleteDisk(ctrl, attach(ctrl, newDisk("D0", "P0"))), 0);
    EXPECT_EQ(members(pool), (std::vector<std::string>{"D1", "D2"}));
}

TEST_F(DiskDelete, SaysWhereTheDiskWasRemovedFrom) {
    addMember(pool, "D0");
    DeleteDisk(ctrl, attach(ctrl, newDisk("D0", "P0")));
    std::vector<LogLine> said;
    for (const LogLine& line : CapturedSyslog::lines()) {
        if (line.text.rfind("Disk D0", 0) == 0) said.push_back(line);
    }
    EXPECT_EQ(said, (std::vector<LogLine>{{LOG_INFO, kFromController},
                                          {LOG_INFO, kFromPool},
                                          {LOG_DEBUG, "Disk D0 deleted\n"}}));
    EXPECT_TRUE(
        logged(LOG_DEBUG, formatted("FindStoragePoolByID: found pool %p with P0 in list %p\n",
                                    static_cast<void*>(pool), static_cast<void*>(ctrl->PoolList))));
}

TEST_F(DiskDelete, WithoutAPoolOnlyTheControllerIsNamed) {
    EXPECT_EQ(DeleteDisk(ctrl, attach(ctrl, newDisk("D0", nullptr))), 0);
    EXPECT_EQ(ctrl->DiskList->Size, 0u);
    EXPECT_EQ(CapturedSyslog::count(kFromController), 1u);
    EXPECT_EQ(CapturedSyslog::countContaining("removed from pool"), 0u);
    EXPECT_EQ(CapturedSyslog::count("Disk D0 deleted\n"), 1u);
}

TEST_F(DiskDelete, OfAnUnknownPoolOnlyTheControllerIsNamed) {
    addMember(pool, "D0");
    EXPECT_EQ(DeleteDisk(ctrl, attach(ctrl, newDisk("D0", "P9"))), 0);
    EXPECT_EQ(CapturedSyslog::count(kFromController), 1u);
    EXPECT_EQ(CapturedSyslog::countContaining("removed from pool"), 0u);
    EXPECT_TRUE(logged(LOG_INFO, formatted("FindStoragePoolByID: can not find pool P9 in list %p\n",
                                           static_cast<void*>(ctrl->PoolList))));
    EXPECT_EQ(CapturedSyslog::count("Disk D0 deleted\n"), 1u);
    EXPECT_EQ(members(pool), std::vector<std::string>{"D0"});
}

TEST_F(DiskDelete, KnownPoolThatDoesNotListTheDiskIsNamedAllTheSame) {
    addMember(pool, "D1");
    EXPECT_EQ(DeleteDisk(ctrl, attach(ctrl, newDisk("D0", "P0"))), 0);
    EXPECT_EQ(CapturedSyslog::count(kFromPool), 1u);
    EXPECT_EQ(members(pool), std::vector<std::string>{"D1"});
}

TEST_F(DiskDelete, DiskWithoutAnIDIsDeleted) {
    addMember(pool, "D1");
    DiskDrive_t* disk = zeroed<DiskDrive_t>();
    disk->Pool = ownedCopy("P0");
    EXPECT_EQ(DeleteDisk(ctrl, attach(ctrl, disk)), 0);
    EXPECT_EQ(members(pool), std::vector<std::string>{"D1"});
}

TEST_F(DiskDelete, OnlyItsOwnPoolForgetsIt) {
    StoragePool_t* other = attach(ctrl, newPool("P1"));
    addMember(pool, "D0");
    addMember(other, "D0");
    EXPECT_EQ(DeleteDisk(ctrl, attach(ctrl, newDisk("D0", "P0"))), 0);
    EXPECT_EQ(members(pool), std::vector<std::string>{});
    EXPECT_EQ(members(other), std::vector<std::string>{"D0"});
}

TEST_F(DiskDelete, DiskThatIsNotCachedKeepsItsMembership) {
    addMember(pool, "D0");
    DiskDrive_t* disk = newDisk("D0", "P0");
    EXPECT_EQ(DeleteDisk(ctrl, disk), -3);
    EXPECT_EQ(members(pool), std::vector<std::string>{"D0"});
    EXPECT_STREQ(disk->DeviceID, "D0");
    FreeDisk(disk);
}

TEST_F(DiskDelete, MutexIsHeldFromBeginningToEnd) {
    addMember(pool, "D0");
    DiskDrive_t* disk = attach(ctrl, newDisk("D0", "P0"));
    int lines = 0;
    CapturedSyslog::onLine([&](const LogLine& line) {
        lines++;
        EXPECT_EQ(pthread_mutex_trylock(&ctrl->CtrlMutex), EBUSY) << line.text;
    });
    EXPECT_EQ(DeleteDisk(ctrl, disk), 0);
    EXPECT_GE(lines, 9);
    CapturedSyslog::onLine(nullptr);
    EXPECT_EQ(pthread_mutex_trylock(&ctrl->CtrlMutex), 0);
    pthread_mutex_unlock(&ctrl->CtrlMutex);
}

}  // namespace
}  // namespace plexortest
