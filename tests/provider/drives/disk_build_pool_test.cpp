// The walk over the pools that a drive's extent may belong to.
#include "disk_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class DiskBuildPool : public DiskTest {
protected:
    void SetUp() override {
        DiskTest::SetUp();
        // The walk is the test's: the drive begins without a pool.
        repository.dissociate("Sample_ConcreteComponent", poolPath_, objects_.extent);
    }

    /// Adds a candidate of that InstanceID, behind those added before.
    void candidate(const std::string& id) {
        vendor.tie("CIM_ConcreteComponent", vendor.pool(card, id), objects_.extent);
    }
    /// Adds a candidate whose path has that InstanceID, or none.
    void oddCandidate(const std::optional<CimValue>& id) {
        Path path{"root/sample", "Sample_StoragePool", {{"Other", CimValue::string("x")}}};
        if (id) path.key("InstanceID", *id);
        repository.put({path, {}});
        vendor.tie("CIM_ConcreteComponent", path, objects_.extent);
    }
    /// How the log tells of each candidate's look-up.
    Texts lookUps() {
        Texts found;
        for (const std::string& line : logLines(names()))
            if (line.find("FindStoragePoolByID") != std::string::npos) found.push_back(line);
        return found;
    }
};

TEST_F(DiskBuildPool, TakesTheFirstCachedCandidate) {
    StoragePool_t* second = attach(ctrl, newPool("P2"));
    candidate("not cached");
    candidate("P2");
    candidate("P1");
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "P2");
    EXPECT_THAT(members(second), ElementsAre("D1"));
    EXPECT_THAT(members(pool_), IsEmpty());
}

TEST_F(DiskBuildPool, EndsTheWalkAtTheFirstCachedCandidate) {
    candidate("first");
    candidate("P1");
    candidate("third");
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(
        lookUps(),
        ElementsAre("DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
                    "INFO FindStoragePoolByID: can not find pool first in list <pools>\n",
                    "DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
                    "DEBUG FindStoragePoolByID: found pool <pool> with P1 in list <pools>\n"));
    EXPECT_EQ(CapturedSyslog::countContaining("third"), 0u);
}

TEST_F(DiskBuildPool, KeepsTheLastCandidateWhenNoneIsCached) {
    candidate("first");
    candidate("second");
    candidate("last");
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "last");
    EXPECT_THAT(members(pool_), IsEmpty());
    EXPECT_EQ(ctrl->DiskList->Size, 1u);
    EXPECT_EQ(ctrl->DiskUpdateTime, kStart);
    EXPECT_EQ(CapturedSyslog::countContaining("BuildDiskInfo: found a pool"), 0u);
}

TEST_F(DiskBuildPool, WithoutCachedPoolInsertsWithoutMembership) {
    candidate("unknown");
    ASSERT_EQ(buildDisk(), 0);
    Texts lines = logLines(names());
    ASSERT_GE(lines.size(), 5u);
    lines.erase(lines.begin(), lines.end() - 6);
    EXPECT_THAT(lines,
                ElementsAre("DEBUG FindStoragePoolByID: checking pool <pool> (ID: P1)\n",
                            "INFO FindStoragePoolByID: can not find pool unknown in list <pools>\n",
                            "DEBUG Adding data <disk> to the list <disks> at the tail\n",
                            "DEBUG Data <disk> added to the list <disks>, size 1\n",
                            "DEBUG BuildDiskInfo: disk <disk> added to the list <disks>\n",
                            "DEBUG BuildDiskInfo, EXIT(0).\n"));
}

TEST_F(DiskBuildPool, ComparesIdentifiersWithTheirCase) {
    candidate("p1");
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "p1");
    EXPECT_THAT(members(pool_), IsEmpty());
}

TEST_F(DiskBuildPool, GoesOnBehindACandidateWithoutIdentifier) {
    oddCandidate({});
    oddCandidate(CimValue::null(CMPI_string));
    oddCandidate(CimValue::uint32(1));
    candidate("P1");
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_STREQ(disk()->Pool, "P1");
    EXPECT_THAT(members(pool_), ElementsAre("D1"));
}

TEST_F(DiskBuildPool, ReplacesAnEarlierCandidateByOneWithoutIdentifier) {
    candidate("unknown");
    oddCandidate({});
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("No pool associated with disk " + kDrive + "\n"));
    expectNothingCached();
}

TEST_F(DiskBuildPool, TurnsAwayADriveWithoutCandidates) {
    EXPECT_EQ(buildDisk(), -1);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_ERR),
                ElementsAre("No pool associated with disk " + kDrive + "\n"));
    expectNothingCached();
}

TEST_F(DiskBuildPool, GoesOnBehindACandidateThatCannotBeCopied) {
    candidate("P1");
    StoragePool_t* second = attach(ctrl, newPool("P2"));
    candidate("P2");
    const auto fault = FailAllocation::strdupOf("P1");
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_WARNING),
                ElementsAre("strdup() failed to duplicate string P1\n"));
    EXPECT_STREQ(disk()->Pool, "P2");
    EXPECT_THAT(members(second), ElementsAre("D1"));
}

TEST_F(DiskBuildPool, LooksAtThePoolsAsTheyAreAtEachStep) {
    candidate("first");
    candidate("P2");
    StoragePool_t* late = nullptr;
    faults().add(along("CIM_ConcreteComponent", watch(testbed::Entry::AssociatorNames, [&] {
                           late = attach(ctrl, newPool("P2"));
                       })));
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(members(late), ElementsAre("D1"));
}

TEST_F(DiskBuildPool, JoinsBehindTheMembersThatAreThere) {
    addMember(pool_, "D0");
    candidate("P1");
    ASSERT_EQ(buildDisk(), 0);
    EXPECT_THAT(members(pool_), ElementsAre("D0", "D1"));
}

}  // namespace
}  // namespace plexortest
