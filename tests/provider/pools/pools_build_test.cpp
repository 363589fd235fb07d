// One pool's record: from the vendor's instance into the controller's list.
#include "pools_fixture.h"

namespace plexortest {
namespace {

using testbed::Broker;
using testbed::CimValue;
using testing::ElementsAre;

class PoolsBuild : public EnclosureTest {
protected:
    void SetUp() override {
        EnclosureTest::SetUp();
        path = vendor.pool(card, "P1", true);
    }
    static LogLine dump(const Path& path, const std::string& id, const std::string& rest) {
        return infoLine("\nPoolOp: " + path.text() + "\n\tInstanceID            - " + id + rest);
    }

    Path path;
};

TEST_F(PoolsBuild, EveryFieldIsFilled) {
    set(path, "TotalManagedSpace", CimValue::uint64(18'446'744'073'709'551'615u));
    set(path, "RemainingManagedSpace", CimValue::uint64(4'294'967'296u));
    set(path, "OperationalStatus", CimValue::uint16Array({6, 2}));
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
    EXPECT_EQ(pool->Drives, &pool->_Drives);
    EXPECT_EQ(pool->_Drives.Size, 0u);
    EXPECT_EQ(pool->_Drives.Head, nullptr);
}

TEST_F(PoolsBuild, Log) {
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

TEST_F(PoolsBuild, OtherPropertiesMayBeMissing) {
    for (const char* property :
         {"TotalManagedSpace", "RemainingManagedSpace", "Primordial", "OperationalStatus"}) {
        unset(path, property);
    }
    EXPECT_EQ(buildPool(path), 0);
    ASSERT_EQ(pools().size(), 1u);
    EXPECT_EQ(pools()[0]->TotalManagedSpace, 0u);
    EXPECT_EQ(pools()[0]->RemainingManagedSpace, 0u);
    EXPECT_EQ(pools()[0]->Primordial, 0);
    EXPECT_EQ(pools()[0]->OperationalStatus, 0);
}

TEST_F(PoolsBuild, OtherPropertiesMayHoldAnything) {
    for (const OddValue& odd : oddNumbers()) {
        for (const char* property : {"TotalManagedSpace", "RemainingManagedSpace", "Primordial"}) {
            give(path, property, odd);
        }
        EXPECT_EQ(buildPool(path), 0) << odd.label;
        ASSERT_EQ(pools().size(), 1u);
        EXPECT_EQ(pools()[0]->TotalManagedSpace, 0u) << odd.label;
        EXPECT_EQ(pools()[0]->RemainingManagedSpace, 0u) << odd.label;
        EXPECT_EQ(pools()[0]->Primordial, 0) << odd.label;
        EXPECT_EQ(pools()[0]->OperationalStatus, 2) << odd.label;
        forgetAll();
    }
}

TEST_F(PoolsBuild, NarrowNumbersAreNumbers) {
    set(path, "TotalManagedSpace", CimValue::uint32(4'000'000'000u));
    set(path, "RemainingManagedSpace", CimValue::uint16(65'535));
    EXPECT_EQ(buildPool(path), 0);
    EXPECT_EQ(pools()[0]->TotalManagedSpace, 4'000'000'000u);
    EXPECT_EQ(pools()[0]->RemainingManagedSpace, 65'535u);
}

TEST_F(PoolsBuild, EmptyTextsAreTexts) {
    set(path, "PoolID", CimValue::string(""));
    set(path, "InstanceID", CimValue::string(""));
    EXPECT_EQ(buildPool(path), 0);
    ASSERT_EQ(pools().size(), 1u);
    EXPECT_STREQ(pools()[0]->PoolID, "");
    EXPECT_STREQ(pools()[0]->InstanceID, "");
}

}  // namespace
}  // namespace plexortest
