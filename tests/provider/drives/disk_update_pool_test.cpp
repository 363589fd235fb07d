// A cached drive's pool: re-asserted at every update, changed when the vendor says so.
#include "disk_update_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testing::ElementsAre;
using testing::IsEmpty;

class DiskUpdatePool : public DiskUpdateTest {
protected:
    /// The vendor's drive is in that pool only.
    void moveTo(const std::string& id) {
        leavePool();
        vendor.tie("CIM_ConcreteComponent", vendor.pool(card, id), objects_.extent);
    }
    void leavePool() {
        repository.dissociate("Sample_ConcreteComponent", poolPath_, objects_.extent);
    }
};

TEST_F(DiskUpdatePool, MovesTheDriveWithItsMembership) {
    StoragePool_t* second = attach(ctrl, newPool("P2"));
    addMember(pool_, "D0");
    moveTo("P2");
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "P2");
    EXPECT_THAT(members(pool_), ElementsAre("D0"));
    EXPECT_THAT(members(second), ElementsAre("D1"));
    EXPECT_EQ(ctrl->DiskUpdateTime, kLater);
}

TEST_F(DiskUpdatePool, LogsTheMove) {
    StoragePool_t* second = attach(ctrl, newPool("P2"));
    AddressNames known = names();
    known.emplace_back(second, "second");
    known.emplace_back(second->Drives, "members of second");
    moveTo("P2");
    ASSERT_EQ(updateDisk(), 0);
    ASSERT_THAT(members(second), ElementsAre("D1"));
    known.emplace_back(second->Drives->Head->Data, "new member");
    EXPECT_THAT(
        logLines(known),
        ElementsAre("DEBUG CheckAndUpdateDiskInfo: ENTER. disk - Disk D1\n", kGetExtent, kGetPools,
                    "DEBUG CheckAndUpdateDiskInfo: disk D1 pool changed, old P1, new P2\n",
                    "DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
                    "DEBUG FindStoragePoolByID: found pool <pool> with P1 in list <pools>\n",
                    testing::AnyOf("DEBUG Removing data <members> from list <member>\n",
                                   "DEBUG Removing data <members> from list <new member>\n"),
                    testing::AnyOf("DEBUG Data <member> removed from list <members>, size 0\n",
                                   "DEBUG Data <new member> removed from list <members>, size 0\n"),
                    "DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
                    "DEBUG FindStoragePoolByID: checking pool <second> (ID: P2)\n",
                    "DEBUG FindStoragePoolByID: found pool <second> with P2 in list <pools>\n",
                    testing::StartsWith("DEBUG Adding data <"), testing::StartsWith("DEBUG Data <"),
                    "DEBUG CheckAndUpdateDiskInfo, exit\n"));
}

TEST_F(DiskUpdatePool, HoldsTheLockForTheMoveAndNotForTheQuery) {
    attach(ctrl, newPool("P2"));
    moveTo("P2");
    watchLock();
    watchLog();
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_GT(watchedCalls_, 1);
    EXPECT_EQ(heldCalls_, 0);
    for (const std::string& line : logWithLock()) {
        const bool ofLists = line.find("FindStoragePoolByID") != std::string::npos ||
                             line.find("ata <?>") != std::string::npos;
        EXPECT_EQ(line.starts_with("held"), ofLists) << line;
    }
}

TEST_F(DiskUpdatePool, MovesToAPoolThatIsNotCached) {
    moveTo("unknown");
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "unknown");
    EXPECT_THAT(members(pool_), IsEmpty());
}

TEST_F(DiskUpdatePool, JoinsAPoolThatIsCachedLater) {
    moveTo("late");
    ASSERT_EQ(updateDisk(), 0);
    StoragePool_t* late = attach(ctrl, newPool("late"));
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(members(late), ElementsAre("D1"));
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(members(late), ElementsAre("D1"));
}

TEST_F(DiskUpdatePool, MovesFromAPoolThatIsCachedNoLonger) {
    ASSERT_EQ(DeletePool(ctrl, pool_), 0);
    pool_ = attach(ctrl, newPool("P2"));
    moveTo("P2");
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "P2");
    EXPECT_THAT(members(pool_), ElementsAre("D1"));
}

TEST_F(DiskUpdatePool, RejoinsAPoolThatWasBuiltAnew) {
    ASSERT_EQ(DeletePool(ctrl, pool_), 0);
    pool_ = attach(ctrl, newPool("P1"));
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(members(pool_), ElementsAre("D1"));
    EXPECT_EQ(CapturedSyslog::countContaining("pool changed"), 0u);
}

TEST_F(DiskUpdatePool, LooksAtTheFirstCandidateOnly) {
    StoragePool_t* second = attach(ctrl, newPool("P2"));
    leavePool();
    vendor.tie("CIM_ConcreteComponent", vendor.pool(card, "unknown"), objects_.extent);
    vendor.tie("CIM_ConcreteComponent", vendor.pool(card, "P2"), objects_.extent);
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "unknown");
    EXPECT_THAT(members(second), IsEmpty());
}

TEST_F(DiskUpdatePool, ComparesIdentifiersWithTheirCase) {
    moveTo("p1");
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "p1");
    EXPECT_THAT(members(pool_), IsEmpty());
}

TEST_F(DiskUpdatePool, KeepsThePoolWhenNoneIsTold) {
    leavePool();
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    expectUnchanged();
}

TEST_F(DiskUpdatePool, ToldOfNoneRejoinsNothing) {
    leavePool();
    RemoveDiskFromPool(pool_, "D1");
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(members(pool_), IsEmpty());
}

TEST_F(DiskUpdatePool, KeepsThePoolWhenTheQueryFails) {
    faults().add(along("CIM_ConcreteComponent",
                       refusal(Entry::AssociatorNames, CMPI_RC_ERR_FAILED, "busy")));
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("AssociatorNames " + kExtent +
                            " (assocClass: CIM_ConcreteComponent, resultClass: CIM_StoragePool) "
                            "failed, status: rc 1, msg busy"));
    expectUnchanged();
}

TEST_F(DiskUpdatePool, KeepsThePoolWhenTheQueryAnswersNull) {
    faults().add(along("CIM_ConcreteComponent", answerNull(Entry::AssociatorNames)));
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR), IsEmpty());
    expectUnchanged();
}

TEST_F(DiskUpdatePool, SurvivesACandidateWithoutIdentifier) {
    const std::optional<CimValue> keys[] = {
        {}, CimValue::null(CMPI_string), CimValue::uint32(0xDEAD'BEEF)};
    for (const auto& key : keys) {
        SCOPED_TRACE(key ? key->text() : "missing");
        leavePool();
        Path path{"root/sample", "Sample_StoragePool", {{"Other", CimValue::string("x")}}};
        if (key) path.key("InstanceID", *key);
        repository.put({path, {}});
        vendor.tie("CIM_ConcreteComponent", path, objects_.extent);
        ASSERT_EQ(updateDisk(), 0);
        EXPECT_EQ(ctrl->DiskUpdateTime, kLater);
        EXPECT_STREQ(disk()->Pool, "P1");
        EXPECT_THAT(members(pool_), ElementsAre(disk()->DeviceID));
        repository.dissociate("Sample_ConcreteComponent", path, objects_.extent);
    }
}

TEST_F(DiskUpdatePool, LosesAPoolWhoseIdentifierCannotBeCopied) {
    attach(ctrl, newPool("P2"));
    moveTo("P2");
    {
        const auto fault = FailAllocation::strdupOf("P2");
        ASSERT_EQ(updateDisk(), 0);
    }
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_WARNING),
                ElementsAre("strdup() failed to duplicate string P2\n"));
    EXPECT_EQ(disk()->Pool, nullptr);
    EXPECT_THAT(members(pool_), IsEmpty());
    EXPECT_EQ(ctrl->DiskUpdateTime, kLater);

    CapturedSyslog::clear();
    ASSERT_EQ(updateDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "P2");
    EXPECT_TRUE(
        logged(LOG_DEBUG, "CheckAndUpdateDiskInfo: disk D1 pool changed, old NULL, new P2\n"));
}

TEST_F(DiskUpdatePool, SurvivesEveryFailingAllocation) {
    StoragePool_t* second = attach(ctrl, newPool("P2"));
    const Path secondPath = vendor.pool(card, "P2");
    const std::size_t allocations = forEachFailingAllocation([&](std::size_t n) {
        SCOPED_TRACE(n);
        const bool forth = disk()->Pool == nullptr || std::string(disk()->Pool) == "P1";
        repository.dissociate("Sample_ConcreteComponent", forth ? poolPath_ : secondPath,
                              objects_.extent);
        repository.dissociate("Sample_ConcreteComponent", forth ? secondPath : poolPath_,
                              objects_.extent);
        vendor.tie("CIM_ConcreteComponent", forth ? secondPath : poolPath_, objects_.extent);
        ASSERT_EQ(updateDisk(), 0);
        EXPECT_THAT(members(forth ? pool_ : second), IsEmpty());
        EXPECT_LE(members(forth ? second : pool_).size(), 1u);
    });
    EXPECT_EQ(allocations, 3u) << "the new identifier, the member and its entry";
}

TEST_F(DiskUpdatePool, WaitsForTheLockBeforeItChangesAnything) {
    setStatus(2, 2);
    CMPIInstance* fresh = instanceAt(objects_.drive);
    updateWhileLockIsTaken(CheckAndUpdateDiskInfo, disk(), fresh, 1, [&] {
        EXPECT_EQ(disk()->OperationalStatus, 5);
        EXPECT_EQ(disk()->ExtentStatus, 16);
        EXPECT_EQ(CapturedSyslog::countContaining("status changed"), 0u);
        EXPECT_EQ(ctrl->DiskUpdateTime, kStart);
    });
    EXPECT_EQ(disk()->OperationalStatus, 2);
    EXPECT_EQ(ctrl->DiskUpdateTime, kLater);
}

TEST_F(DiskUpdatePool, WaitsForTheLockToRejoinAndToStamp) {
    RemoveDiskFromPool(pool_, "D1");
    CMPIInstance* fresh = instanceAt(objects_.drive);
    updateWhileLockIsTaken(CheckAndUpdateDiskInfo, disk(), fresh, 2, [&] {
        EXPECT_THAT(members(pool_), IsEmpty());
        EXPECT_EQ(ctrl->DiskUpdateTime, kStart);
    });
    EXPECT_THAT(members(pool_), ElementsAre("D1"));
    EXPECT_EQ(ctrl->DiskUpdateTime, kLater);
}

}  // namespace
}  // namespace plexortest
