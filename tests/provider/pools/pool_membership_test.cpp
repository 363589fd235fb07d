// The drives that a pool lists.
#include "PlexorProviderUtilIndex.h"
#include "provider_fixture.h"

namespace plexortest {
namespace {

class PoolMembership : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        pool = attach(attach(newController("C0")), newPool("P0"));
    }

    std::vector<std::string> members() const {
        std::vector<std::string> names;
        for (const List_Entry_t* entry = pool->_Drives.Head; entry != nullptr;
             entry = entry->Next) {
            names.push_back(static_cast<const char*>(entry->Data));
        }
        EXPECT_EQ(pool->_Drives.Size, names.size());
        return names;
    }

    using Names = std::vector<std::string>;
    StoragePool_t* pool = nullptr;
};

TEST_F(PoolMembership, DrivesAreAppended) {
    AddDiskToPool(pool, "D1");
    AddDiskToPool(pool, "D0");
    EXPECT_EQ(members(), (Names{"D1", "D0"}));
}

TEST_F(PoolMembership, PoolOwnsItsCopies) {
    char id[] = "D0";
    AddDiskToPool(pool, id);
    ASSERT_NE(pool->_Drives.Head, nullptr);
    EXPECT_NE(pool->_Drives.Head->Data, id);
    id[1] = '7';
    EXPECT_EQ(members(), Names{"D0"});
}

TEST_F(PoolMembership, DriveIsListedOnce) {
    AddDiskToPool(pool, "D0");
    AddDiskToPool(pool, "D1");
    CapturedSyslog::clear();
    AddDiskToPool(pool, "D0");
    AddDiskToPool(pool, "D1");
    EXPECT_EQ(members(), (Names{"D0", "D1"}));
    EXPECT_EQ(CapturedSyslog::countContaining("Adding data"), 0u);
}

TEST_F(PoolMembership, ADriveIsListedOnceInWhateverOrderItIsAskedFor) {
    const Names ids = {"D0", "D1", "D2", "D3"};
    for (const std::string& id : ids) AddDiskToPool(pool, id.c_str());
    for (const char* id : {"D2", "D3", "D3", "D0", "D2", "D1"}) AddDiskToPool(pool, id);
    EXPECT_EQ(members(), ids);
}

/// A pool that has more drives than are walked through for each.
class LargePoolMembership : public PoolMembership {
protected:
    void SetUp() override {
        PoolMembership::SetUp();
        for (int i = 0; i < 100; i++) expected_.push_back("D" + std::to_string(i));
        addAll();
    }
    void addAll() {
        for (const std::string& id : expected_) AddDiskToPool(pool, id.c_str());
    }

    Names expected_;
};

TEST_F(LargePoolMembership, ADriveIsListedOnce) {
    EXPECT_EQ(members(), expected_);
    addAll();
    EXPECT_EQ(members(), expected_);
}

TEST_F(LargePoolMembership, ADriveIsLookedUpInAnIndex) {
    EXPECT_NE(KeptIndex(pool->Drives), nullptr);
}

TEST_F(LargePoolMembership, DrivesThatMoveAwayAndBackDoNotCostALookAtAllEach) {
    const FailAllocation counted = FailAllocation::none();
    for (const char* id : {"D50", "D0", "D99", "D50", "D1"}) {
        RemoveDiskFromPool(pool, id);
        AddDiskToPool(pool, id);
    }
    EXPECT_EQ(counted.calls(), 5u * 2) << "a copy and an entry each, and no index anew";
    EXPECT_EQ(pool->Drives->Size, 100u);
    EXPECT_STREQ(static_cast<const char*>(pool->Drives->Tail->Data), "D1");
}

TEST_F(PoolMembership, WhatWasFoundInOnePoolSaysNothingOfAnother) {
    StoragePool_t* other = attach(attach(newController("C1")), newPool("P1"));
    for (const char* id : {"D0", "D1"}) AddDiskToPool(pool, id);
    AddDiskToPool(pool, "D1");
    AddDiskToPool(other, "D1");
    AddDiskToPool(other, "D0");
    AddDiskToPool(pool, "D0");
    EXPECT_EQ(members(), (Names{"D0", "D1"}));
    EXPECT_EQ(other->_Drives.Size, 2u);
}

TEST_F(PoolMembership, LetterCaseCounts) {
    AddDiskToPool(pool, "D0");
    AddDiskToPool(pool, "d0");
    EXPECT_EQ(members(), (Names{"D0", "d0"}));
    RemoveDiskFromPool(pool, "d0");
    EXPECT_EQ(members(), Names{"D0"});
}

TEST_F(PoolMembership, NullsAddNothing) {
    AddDiskToPool(nullptr, "D0");
    AddDiskToPool(pool, nullptr);
    AddDiskToPool(nullptr, nullptr);
    EXPECT_EQ(members(), Names{});
    EXPECT_EQ(CapturedSyslog::lines(), std::vector<LogLine>{});
}

TEST_F(PoolMembership, FailedCopyIsLoggedAndAddsNothing) {
    AddDiskToPool(pool, "D1");
    CapturedSyslog::clear();
    const auto fault = FailAllocation::strdupOf("D0");
    AddDiskToPool(pool, "D0");
    EXPECT_EQ(members(), Names{"D1"});
    EXPECT_EQ(
        CapturedSyslog::lines(),
        (std::vector<LogLine>{{LOG_WARNING, "strdup() failed to duplicate string D0\n"},
                              {LOG_DEBUG, formatted("Adding data %p to the list %p at the tail\n",
                                                    static_cast<void*>(nullptr),
                                                    static_cast<void*>(&pool->_Drives))}}));
}

TEST_F(PoolMembership, FailedEntryAddsNothing) {
    const auto fault = FailAllocation::nth(1, Allocator::Calloc);
    AddDiskToPool(pool, "D0");
    EXPECT_EQ(fault.failures(), 1u);
    EXPECT_EQ(members(), Names{});
}

TEST_F(PoolMembership, SurvivesEveryFailingAllocation) {
    const std::size_t allocations = forEachFailingAllocation([&](std::size_t) {
        AddDiskToPool(pool, "D0");
        EXPECT_LE(members().size(), 1u);
        RemoveDiskFromPool(pool, "D0");
        EXPECT_EQ(members(), Names{});
    });
    EXPECT_EQ(allocations, 2u);
}

TEST_F(PoolMembership, DriveIsTakenOut) {
    for (const char* id : {"D0", "D1", "D2"}) AddDiskToPool(pool, id);
    RemoveDiskFromPool(pool, "D1");
    EXPECT_EQ(members(), (Names{"D0", "D2"}));
    RemoveDiskFromPool(pool, "D2");
    EXPECT_EQ(members(), Names{"D0"});
    RemoveDiskFromPool(pool, "D0");
    EXPECT_EQ(members(), Names{});
}

TEST_F(PoolMembership, RemovalGoesThroughTheList) {
    AddDiskToPool(pool, "D0");
    const void* copy = pool->_Drives.Head->Data;
    const void* list = &pool->_Drives;
    CapturedSyslog::clear();
    RemoveDiskFromPool(pool, "D0");
    EXPECT_EQ(CapturedSyslog::lines(),
              (std::vector<LogLine>{
                  {LOG_DEBUG, formatted("Removing data %p from list %p\n", list, copy)},
                  {LOG_DEBUG, formatted("Data %p removed from list %p, size 0\n", copy, list)}}));
}

TEST_F(PoolMembership, FirstOfEqualMembersIsTakenOut) {
    for (const char* id : {"D0", "D1", "D0"}) addMember(pool, id);
    const void* first = pool->_Drives.Head->Data;
    RemoveDiskFromPool(pool, "D0");
    EXPECT_EQ(members(), (Names{"D1", "D0"}));
    EXPECT_NE(pool->_Drives.Tail->Data, first);
}

TEST_F(PoolMembership, UnknownDriveTakesNothingOut) {
    AddDiskToPool(pool, "D0");
    RemoveDiskFromPool(pool, "D");
    RemoveDiskFromPool(pool, "D00");
    RemoveDiskFromPool(pool, "");
    EXPECT_EQ(members(), Names{"D0"});
}

TEST_F(PoolMembership, NullsTakeNothingOut) {
    AddDiskToPool(pool, "D0");
    RemoveDiskFromPool(nullptr, "D0");
    RemoveDiskFromPool(pool, nullptr);
    EXPECT_EQ(members(), Names{"D0"});
}

TEST_F(PoolMembership, OnlyMemberCanBeReplaced) {
    AddDiskToPool(pool, "D0");
    RemoveDiskFromPool(pool, "D0");
    AddDiskToPool(pool, "D1");
    AddDiskToPool(pool, "D2");
    EXPECT_EQ(members(), (Names{"D1", "D2"}));
}

TEST_F(PoolMembership, APoolWithoutAListHasNoMembers) {
    pool->Drives = nullptr;
    AddDiskToPool(pool, "D0");
    RemoveDiskFromPool(pool, "D0");
    EXPECT_EQ(pool->_Drives.Size, 0u);
    EXPECT_EQ(CapturedSyslog::countContaining("Removing data "), 0u);
    pool->Drives = &pool->_Drives;
}

}  // namespace
}  // namespace plexortest
