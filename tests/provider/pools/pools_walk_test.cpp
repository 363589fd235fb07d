// The two walks that a worker does inline, over the pools and over the enclosures of a controller.
#include "pools_fixture.h"

namespace plexortest {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

/// What differs between the two walks.
struct Walk {
    const char* function;
    int (*walk)(const CMPIInstanceMI* mi, const CMPIContext* ctx, RaidController_t* ctrl);
    testbed::ObjectPath (*addOne)(VendorObjects& objects, const VendorController& controller,
                                  const std::string& key);
    const char* mandatory;  ///< property without which a device is rejected
    const char* enter;
    const char* assocClass;
    const char* resultClass;
    const char* rejected;  ///< start of the line that says so
    const char* enterOne;  ///< line of the builder of one device
    List_t* RaidController_t::*list;
    ReleaseFunc_t release;
    pthread_mutex_t RaidController_t::*classMutex;
    time_t RaidController_t::*updateTime;
    std::size_t prefix;  ///< length of what addOne puts in front of a key
};

void PrintTo(const Walk& walk, std::ostream* out) {
    *out << walk.function;
}

testbed::ObjectPath addPool(VendorObjects& objects, const VendorController& controller,
                            const std::string& key) {
    return objects.pool(controller, key);
}

testbed::ObjectPath addChassis(VendorObjects& objects, const VendorController& controller,
                               const std::string& key) {
    return objects.chassis(controller, "C0_" + key);
}

const Walk kWalks[] = {
    {"BuildPoolInfo", BuildPoolInfo, addPool, "PoolID", "BuildPoolInfo, ENTER...\n",
     "CIM_HostedStoragePool", "CIM_StoragePool", "NULL InstanceID or PoolID for pool ",
     "BuildSinglePoolInfo, enter...\n", &RaidController_t::PoolList, FreePool,
     &RaidController_t::PoolCfgMutex, &RaidController_t::PoolUpdateTime, 0},
    {"BuildChassisInfo", BuildChassisInfo, addChassis, "Tag", "BuildChassisInfo, enter...\n",
     "CIM_SystemPackaging", "CIM_Chassis", "NULL tag for chassis ",
     "BuildSingleChassisInfo, enter...\n", &RaidController_t::ChassisList, FreeChassis,
     &RaidController_t::ChassisCfgMutex, &RaidController_t::ChassisUpdateTime, 3},
};

class PoolsAndChassisWalk : public EnclosureTest, public testing::WithParamInterface<Walk> {
protected:
    void TearDown() override {
        EXPECT_TRUE(isFree(ctrl->*GetParam().classMutex));
        EXPECT_TRUE(isFree(ctrl->CtrlMutex));
        EnclosureTest::TearDown();
    }
    Path addOne(const std::string& key) { return GetParam().addOne(vendor, card, key); }
    int walk() {
        startOver();
        return GetParam().walk(&mi, ctx(), ctrl);
    }
    /// What the cached records' keys end with.
    Texts cached() const {
        Texts keys;
        for (const void* record : recordsOf<void>(ctrl->*GetParam().list)) {
            const Path path = testbed::Broker::toPath(GetPoolOp(record));
            keys.push_back(path.keys.back().second.asString().substr(GetParam().prefix));
        }
        return keys;
    }
    void forget() { FreeList(ctrl->*GetParam().list, GetParam().release); }
    LogLine enter() const { return debugLine(GetParam().enter); }
    LogLine exiting(int rc) const {
        return debugLine(formatted("%s, EXIT(%d).\n", GetParam().function, rc));
    }
    std::string classes() const {
        return std::string("(assocClass: ") + GetParam().assocClass +
               ", resultClass: " + GetParam().resultClass + ")";
    }
    LogLine query() const {
        return debugLine(std::string(GetParam().function) +
                         ", CIM Query - Associators: " + card.system.text() + " " + classes());
    }
};

INSTANTIATE_TEST_SUITE_P(Both, PoolsAndChassisWalk, testing::ValuesIn(kWalks),
                         [](const auto& param) { return param.param.function; });

TEST_P(PoolsAndChassisWalk, NoneThere) {
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(cached(), IsEmpty());
    EXPECT_EQ(ctrl->*GetParam().updateTime, 0);
    EXPECT_THAT(inventoryLog(), ElementsAre(enter(), query(), exiting(0)));
}

TEST_P(PoolsAndChassisWalk, CachesAllInTheirOrder) {
    for (const char* key : {"A", "B", "C"}) addOne(key);
    VirtualClock::set(kStart + 3);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(cached(), ElementsAre("A", "B", "C"));
    EXPECT_EQ(ctrl->*GetParam().updateTime, kStart + 3);
    const auto log = inventoryLog();
    EXPECT_EQ(log.size(), 3u + 3u * 4u);
    EXPECT_EQ(log[0], enter());
    EXPECT_EQ(log[1], query());
    EXPECT_EQ(log[2], debugLine(GetParam().enterOne));
    EXPECT_EQ(log.back(), exiting(0));
}

TEST_P(PoolsAndChassisWalk, OneQueryInAll) {
    for (const char* key : {"A", "B", "C"}) addOne(key);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(brokerCalls(), ElementsAre("associators " + card.system.text() + " " +
                                           GetParam().assocClass + "/" + GetParam().resultClass));
}

TEST_P(PoolsAndChassisWalk, OtherControllersAreNotWalked) {
    const VendorController other = vendor.controller("C1");
    GetParam().addOne(vendor, other, "theirs");
    addOne("ours");
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(cached(), ElementsAre("ours"));
}

TEST_P(PoolsAndChassisWalk, SecondWalkAppendsAgain) {
    addOne("A");
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(cached(), ElementsAre("A", "A"));
}

TEST_P(PoolsAndChassisWalk, RejectedOneEndsTheWalk) {
    addOne("A");
    const Path bad = addOne("B");
    addOne("C");
    unset(bad, GetParam().mandatory);
    EXPECT_EQ(walk(), -1);
    EXPECT_THAT(cached(), ElementsAre("A"));
    EXPECT_TRUE(logged(LOG_ERR, GetParam().rejected + bad.text() + "\n"));
    EXPECT_EQ(inventoryLog().back(), exiting(-1));
    EXPECT_EQ(CapturedSyslog::count(GetParam().enterOne), 2u);
}

TEST_P(PoolsAndChassisWalk, FailedQueryIsNoError) {
    addOne("A");
    for (const QueryFailure& failure : queryFailures()) {
        SCOPED_TRACE(failure.name);
        failOnly(along(GetParam().assocClass, failure.answer));
        EXPECT_EQ(walk(), 0);
        EXPECT_THAT(cached(), IsEmpty());
        std::vector<LogLine> expected = {enter(), query()};
        if (failure.logged) {
            expected.push_back(errorLine("Associators " + card.system.text() + " " + classes() +
                                         " failed, " + *failure.logged));
        }
        expected.push_back(exiting(0));
        EXPECT_EQ(inventoryLog(), expected);
        EXPECT_EQ(ctrl->*GetParam().updateTime, 0);
        EXPECT_TRUE(isFree(ctrl->*GetParam().classMutex));
    }
}

TEST_P(PoolsAndChassisWalk, EveryAllocationInTurn) {
    for (const char* key : {"A", "B"}) addOne(key);
    // Four for each device: the record, two copies, the list entry.
    const std::size_t allocations = forEachFailingAllocation([this](std::size_t) {
        forget();
        const int result = walk();
        EXPECT_TRUE(result == 0 || result == -1 || result == -2) << result;
        const std::size_t whole = cached().size();
        EXPECT_EQ(result == 0, whole == 2);
        EXPECT_EQ(books().liveClones(), 1 + whole);
        EXPECT_TRUE(isFree(ctrl->*GetParam().classMutex));
    });
    EXPECT_EQ(allocations, 8u);
}

TEST_P(PoolsAndChassisWalk, ShortageAtTheSecondKeepsTheFirst) {
    for (const char* key : {"A", "B", "C"}) addOne(key);
    // Its record, and its list entry.
    for (const std::size_t allocation : {5u, 8u}) {
        const auto fault = FailAllocation::nth(allocation);
        forget();
        EXPECT_EQ(walk(), -2);
        EXPECT_THAT(cached(), ElementsAre("A"));
        EXPECT_EQ(inventoryLog().back(), exiting(-2));
    }
}

TEST_P(PoolsAndChassisWalk, ElementOfAnotherTypeCostsOnlyItself) {
    for (const char* key : {"A", "B", "C"}) addOne(key);
    const Texts expected[] = {{"B", "C"}, {"A", "C"}, {"A", "B"}};
    for (int wrong = 0; wrong < 3; wrong++) {
        failOnly(wrongElement(wrong));
        forget();
        EXPECT_EQ(walk(), 0);
        EXPECT_EQ(cached(), expected[wrong]);
    }
}

TEST_P(PoolsAndChassisWalk, EnumerationThatFailsEndsTheWalk) {
    for (const char* key : {"A", "B", "C"}) addOne(key);
    const Texts expected[] = {{}, {"A"}, {"A", "B"}};
    for (const Entry entry : {Entry::EnumerationHasNext, Entry::EnumerationGetNext}) {
        for (int good = 0; good < 3; good++) {
            failOnly(failingEnumeration(entry, good));
            forget();
            EXPECT_EQ(walk(), 0);
            EXPECT_EQ(cached(), expected[good]) << testbed::entryName(entry);
            EXPECT_TRUE(isFree(ctrl->*GetParam().classMutex));
        }
    }
}

TEST_P(PoolsAndChassisWalk, ElementThatComesWithAFailureIsNotTaken) {
    for (const char* key : {"A", "B", "C"}) addOne(key);
    auto rule = failingEnumeration(Entry::EnumerationGetNext, 1);
    rule.keepResult = true;
    failOnly(rule);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(cached(), ElementsAre("A"));
}

TEST_P(PoolsAndChassisWalk, EveryCloneInTurnCostsOnlyThePath) {
    for (const char* key : {"A", "B"}) addOne(key);
    for (int clone = 0; clone < 2; clone++) {
        failOnly(answerNull(Entry::Clone, clone));
        forget();
        EXPECT_EQ(walk(), 0);
        const auto records = recordsOf<void>(ctrl->*GetParam().list);
        ASSERT_EQ(records.size(), 2u);
        EXPECT_EQ(GetPoolOp(records[static_cast<std::size_t>(clone)]), nullptr);
        EXPECT_NE(GetPoolOp(records[static_cast<std::size_t>(1 - clone)]), nullptr);
    }
}

TEST_P(PoolsAndChassisWalk, InstanceWithoutPath) {
    addOne("A");
    failOnly(answerNull(Entry::InstanceGetObjectPath));
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ((ctrl->*GetParam().list)->Size, 1u);
}

TEST_P(PoolsAndChassisWalk, ControllerWithoutPath) {
    addOne("A");
    CMPIObjectPath* own = std::exchange(ctrl->ControllerOp, nullptr);
    EXPECT_EQ(walk(), 0);
    EXPECT_THAT(cached(), IsEmpty());
    EXPECT_THAT(books().calls(), IsEmpty());
    EXPECT_TRUE(logged(LOG_DEBUG, std::string(GetParam().function) +
                                      ", CIM Query - Associators: NULL " + classes()));
    ctrl->ControllerOp = own;
}

TEST_P(PoolsAndChassisWalk, HoldsTheClassMutexWhileItBuildsAndNotWhileItAsks) {
    for (const char* key : {"A", "B"}) addOne(key);
    int asked = 0, read = 0;
    faults().add(watch(Entry::Associators, [&] {
        asked++;
        EXPECT_TRUE(isFree(ctrl->*GetParam().classMutex));
    }));
    faults().add(watch(Entry::InstanceGetProperty, [&] {
        read++;
        EXPECT_FALSE(isFree(ctrl->*GetParam().classMutex));
        EXPECT_TRUE(isFree(ctrl->CtrlMutex));
        int held = 0;
        for (pthread_mutex_t* mutex :
             {&ctrl->PoolCfgMutex, &ctrl->ChassisCfgMutex, &ctrl->DiskCfgMutex,
              &ctrl->VolumeCfgMutex, &ctrl->PortCfgMutex, &ctrl->BatteryCfgMutex}) {
            held += isFree(*mutex) ? 0 : 1;
        }
        EXPECT_EQ(held, 1);
    }));
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(asked, 1);
    EXPECT_GE(read, 4);
}

TEST_P(PoolsAndChassisWalk, KeepsTheClassMutexBetweenTwoDevices) {
    for (const char* key : {"A", "B"}) addOne(key);
    int moves = 0;
    // The second element is taken while the first has been appended already.
    faults().add(watch(Entry::EnumerationGetNext, [&] {
        if (moves++ > 0) {
            EXPECT_FALSE(isFree(ctrl->*GetParam().classMutex));
        }
    }));
    EXPECT_EQ(walk(), 0);
    EXPECT_EQ(moves, 2);
}

}  // namespace
}  // namespace plexortest
