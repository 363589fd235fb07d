// One pool's record: from the vendor's instance into the controller's list.
#include "pools_fixture.h"

namespace plexortest {
namespace {

using testbed::Broker;
using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class PoolsBuild : public EnclosureTest {
protected:
    static LogLine dump(const Path& path, const std::string& id, const std::string& rest) {
        return infoLine("\nPoolOp: " + path.text() + "\n\tInstanceID            - " + id + rest);
    }
};

TEST_F(PoolsBuild, EveryFieldIsFilled) {
    const Path path = vendor_.pool(vendor, "P1", true);
    set(path, "TotalManagedSpace", CimValue::uint64(18'446'744'073'709'551'615u));
    set(path, "RemainingManagedSpace", CimValue::uint64(4'294'967'296u));
    set(path, "OperationalStatus", CimValue::uint16Array({6, 2}));
    VirtualClock::set(kStart + 9);
    ASSERT_EQ(buildPool(path), 0);
    ASSERT_EQ(pools().size(), 1u);
    const StoragePool_t* pool = pools()[0];
    EXPECT_EQ(Broker::toPath(pool->PoolOp), path);
    EXPECT_STREQ(pool->InstanceID, "P1");
    EXPECT_STREQ(pool->PoolID, "Pool P1");
    EXPECT_EQ(pool->TotalManagedSpace, 18'446'744'073'709'551'615u);
    EXPECT_EQ(pool->RemainingManagedSpace, 4'294'967'296u);
    EXPECT_EQ(pool->Primordial, 1);
    EXPECT_EQ(pool->OperationalStatus, 6);
    EXPECT_EQ(pool->LastUpdateTime, kStart + 9);
    EXPECT_EQ(pool->UpdateEnabled, 0);
    EXPECT_EQ(pool->Drives, &pool->_Drives);
    EXPECT_EQ(pool->_Drives.Size, 0u);
    EXPECT_EQ(pool->_Drives.Head, nullptr);
    EXPECT_EQ(ctrl->PoolUpdateTime, kStart + 9);
    EXPECT_EQ(ctrl->ControllerUpdateTime, 0);
    EXPECT_EQ(ctrl->ChassisUpdateTime, 0);
}

TEST_F(PoolsBuild, AsksTheBrokerNothing) {
    ASSERT_EQ(buildPool(vendor_.pool(vendor, "P1")), 0);
    EXPECT_THAT(books().calls(), IsEmpty());
}

TEST_F(PoolsBuild, RecordOwnsWhatItHolds) {
    ASSERT_EQ(buildPool(vendor_.pool(vendor, "P1")), 0);
    // The controller's path and the pool's.
    EXPECT_EQ(books().liveClones(), 2u);
    broker.flushThread();
    EXPECT_STREQ(pools()[0]->InstanceID, "P1");
    EXPECT_EQ(Broker::toPath(pools()[0]->PoolOp).findKey("InstanceID")->asString(), "P1");
}

TEST_F(PoolsBuild, AppendsWithoutLookingForDuplicates) {
    const Path path = vendor_.pool(vendor, "P1");
    EXPECT_EQ(buildPool(vendor_.pool(vendor, "P0")), 0);
    EXPECT_EQ(buildPool(path), 0);
    EXPECT_EQ(buildPool(path), 0);
    Texts ids;
    for (const StoragePool_t* pool : pools()) ids.push_back(pool->InstanceID);
    EXPECT_THAT(ids, ElementsAre("P0", "P1", "P1"));
}

TEST_F(PoolsBuild, Log) {
    const Path path = vendor_.pool(vendor, "P1", true);
    set(path, "TotalManagedSpace", CimValue::uint64(18'446'744'073'709'551'615u));
    ASSERT_EQ(buildPool(path), 0);
    EXPECT_THAT(inventoryLog(),
                ElementsAre(debugLine("BuildSinglePoolInfo, enter...\n"),
                            dump(path, "P1",
                                 "\n\tPoolId                - Pool P1"
                                 "\n\tPrimordial            - 1"
                                 "\n\tTotalManagedSpace     - 18446744073709551615"
                                 "\n\tRemainingManagedSpace - 400"
                                 "\n\tOperationalStatus     - 2\n"),
                            debugLine(formatted("BuildSinglePoolInfo: pool %p added to the list\n",
                                                static_cast<void*>(pools()[0]))),
                            debugLine("BuildSinglePoolInfo, EXIT(0).\n")));
}

TEST_F(PoolsBuild, ReadsTheCapacitiesInTheirOrder) {
    const Path path = vendor_.pool(vendor, "P1");
    const CMPIInstance* inst = instanceAt(path);
    books().recordObjectCalls(true);
    startOver();
    ASSERT_EQ(BuildSinglePoolInfo(&mi, ctx(), ctrl, inst, broker.makePath(path)), 0);
    Texts read;
    for (const auto& call : books().calls()) {
        if (call.entry == Entry::InstanceGetProperty) read.push_back(call.name.value());
    }
    EXPECT_THAT(read, ElementsAre("InstanceID", "PoolID", "TotalManagedSpace",
                                  "RemainingManagedSpace", "Primordial", "OperationalStatus"));
}

TEST_F(PoolsBuild, AppendsAndStampsUnderTheControllersMutex) {
    const Path path = vendor_.pool(vendor, "P1");
    {
        const HolderUntilLogged holder(ctrl->CtrlMutex, "\nPoolOp: ", [this] {
            EXPECT_EQ(ctrl->PoolList->Size, 0u);
            EXPECT_EQ(ctrl->PoolUpdateTime, 0);
        });
        EXPECT_EQ(buildPool(path), 0);
    }
    EXPECT_EQ(pools().size(), 1u);
    EXPECT_EQ(ctrl->PoolUpdateTime, kStart);
    EXPECT_TRUE(isFree(ctrl->CtrlMutex));
}

TEST_F(PoolsBuild, ReadsWithoutTheControllersMutex) {
    int reads = 0;
    failOnly(watch(Entry::InstanceGetProperty, [&] {
        reads++;
        EXPECT_TRUE(isFree(ctrl->CtrlMutex));
    }));
    EXPECT_EQ(buildPool(vendor_.pool(vendor, "P1")), 0);
    EXPECT_EQ(reads, 6);
}

TEST_F(PoolsBuild, ClassMutexIsTheCallers) {
    pthread_mutex_lock(&ctrl->PoolCfgMutex);
    EXPECT_EQ(buildPool(vendor_.pool(vendor, "P1")), 0);
    pthread_mutex_unlock(&ctrl->PoolCfgMutex);
}

TEST_F(PoolsBuild, VendorsTextsAreNoFormats) {
    const Path path = vendor_.pool(vendor, "P%s%n");
    ASSERT_EQ(buildPool(path), 0);
    EXPECT_STREQ(pools()[0]->InstanceID, "P%s%n");
    EXPECT_EQ(CapturedSyslog::countContaining("\n\tPoolId                - Pool P%s%n\n"), 1u);
}

TEST_F(PoolsBuild, MaskedLinesCostNoCallForTheirTexts) {
    books().recordObjectCalls(true);
    setlogmask(LOG_UPTO(LOG_ERR));
    ASSERT_EQ(buildPool(vendor_.pool(vendor, "P1")), 0);
    EXPECT_EQ(books().count(Entry::PathToString), 0u);
}

}  // namespace
}  // namespace plexortest
