// Batteries: filled from one instance, watched for changes of status.
#include "device_kinds.h"
#include "odd_values.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::Entry;
using testing::ElementsAre;
using testing::IsEmpty;

class BatteryTest : public KindTest<BatteryKind> {
protected:
    const std::string kBattery =
        "root/sample:Sample_Battery.SystemCreationClassName=\"Sample_ComputerSystem\","
        "SystemName=\"sample\",CreationClassName=\"Sample_Battery\",DeviceID=\"X1\"";

    void SetUp() override {
        KindTest::SetUp();
        repository.setProperty(path_, "BatteryStatus", CimValue::uint16(7));
        repository.setProperty(path_, "OperationalStatus", CimValue::uint16Array({11, 2}));
    }
    AddressNames names() const {
        AddressNames known = {{ctrl->BatteryList, "batteries"}};
        if (record() != nullptr) known.emplace_back(record(), "battery");
        return known;
    }
};

using BatteryBuild = BatteryTest;

TEST_F(BatteryBuild, HoldsWhatTheVendorSays) {
    ASSERT_EQ(buildIt(), 0);
    EXPECT_STREQ(record()->DeviceID, "X1");
    EXPECT_EQ(record()->BatteryStatus, 7);
    EXPECT_EQ(record()->OperationalStatus, 11);
}

TEST_F(BatteryBuild, AsksNothing) {
    ASSERT_EQ(buildIt(), 0);
    EXPECT_THAT(brokerCalls(), IsEmpty());
}

TEST_F(BatteryBuild, ReadsThePropertiesInOrder) {
    books().recordObjectCalls(true);
    ASSERT_EQ(buildIt(), 0);
    EXPECT_THAT(propertiesRead("Sample_Battery"),
                ElementsAre("DeviceID", "BatteryStatus", "OperationalStatus"));
}

TEST_F(BatteryBuild, LogsEveryStepAndHoldsTheLockForTheInsertionOnly) {
    watchLock();
    watchLog();
    ASSERT_EQ(buildIt(), 0);
    EXPECT_THAT(
        logWithLock(names()),
        ElementsAre("free DEBUG BuildBatteryInfo, ENTER...\n",
                    "free INFO \nBatteryOp: " + kBattery +
                        "\n"
                        "\tDeviceID          - X1\n"
                        "\tBatteryStatus     - 7\n"
                        "\tOperationalStatus - 11\n",
                    "held DEBUG Adding data <battery> to the list <batteries> at the tail\n",
                    "held DEBUG Data <battery> added to the list <batteries>, size 1\n",
                    "free DEBUG BuildBatteryInfo: battery <battery> added to the list\n",
                    "free DEBUG BuildBatteryInfo, EXIT(0).\n"));
    EXPECT_EQ(watchedCalls_, 3);
    EXPECT_EQ(heldCalls_, 0);
}

TEST_F(BatteryBuild, OddStatusCountsAsZero) {
    for (const OddValue& odd : oddNumbers()) {
        SCOPED_TRACE(odd.label);
        give(path_, "BatteryStatus", odd);
        ASSERT_EQ(buildIt(), 0);
        EXPECT_EQ(record()->BatteryStatus, 0);
        ASSERT_EQ(DeleteBattery(ctrl, record()), 0);
    }
}

TEST_F(BatteryBuild, WithoutMemoryForTheListEntryIsReleased) {
    watchLog();
    {
        const auto fault = FailAllocation::nth(3);
        EXPECT_EQ(buildIt(), -2);
        EXPECT_EQ(fault.failures(), 1u);
    }
    Texts lines = logWithLock(names());
    lines.erase(lines.begin(), lines.begin() + 2);
    EXPECT_THAT(
        lines,
        ElementsAre("held DEBUG Adding data <?> to the list <batteries> at the tail\n",
                    "free ERR BuildBatteryInfo: failed to add battery to list, rc -2.\n",
                    "free DEBUG Battery X1 deleted\n", "free DEBUG BuildBatteryInfo, EXIT(-2).\n"));
    expectNothingCached();
}

TEST_F(BatteryBuild, SurvivesEveryFailingAllocation) {
    const std::size_t allocations = forEachFailingAllocation([&](std::size_t n) {
        SCOPED_TRACE(n);
        ctrl->BatteryUpdateTime = 0;
        const int rc = buildIt();
        if (rc != 0) return expectNothingCached();
        EXPECT_EQ(DeleteBattery(ctrl, record()), 0);
    });
    EXPECT_EQ(allocations, 3u) << "record, identifier, list entry";
}

class BatteryUpdate : public BatteryTest {
protected:
    void SetUp() override {
        BatteryTest::SetUp();
        ASSERT_EQ(buildIt(), 0);
        goOnLater();
    }
    int updateBattery(CMPIInstance* fresh) {
        return update(CheckAndUpdateBatteryInfo, record(), fresh);
    }
    int updateBattery() { return updateBattery(instanceAt(path_)); }
    void setStatus(std::uint16_t operational, std::uint16_t battery) {
        repository.setProperty(path_, "OperationalStatus", CimValue::uint16Array({operational}));
        repository.setProperty(path_, "BatteryStatus", CimValue::uint16(battery));
    }
    void expectStatus(int operational, int battery) {
        EXPECT_EQ(record()->OperationalStatus, operational);
        EXPECT_EQ(record()->BatteryStatus, battery);
        EXPECT_EQ(record()->LastUpdateTime, kStart);
        EXPECT_EQ(ctrl->BatteryUpdateTime, kLater);
    }

    const std::string kEnter = "DEBUG CheckAndUpdateBatteryInfo: ENTER. battery - X1\n";
    const std::string kGet =
        "DEBUG CheckAndUpdateBatteryInfo, CIM Query - GetInstance: " + kBattery;
    const std::string kExit = "DEBUG CheckAndUpdateBatteryInfo, exit.\n";
};

TEST_F(BatteryUpdate, OfAnUnchangedBatterySaysNothing) {
    ASSERT_EQ(updateBattery(), 0);
    EXPECT_THAT(logLines(), ElementsAre(kEnter, kExit));
    EXPECT_THAT(brokerCalls(), IsEmpty());
    expectStatus(11, 7);
}

struct BatteryChange {
    const char* label;
    std::uint16_t operational, battery;
    const char* line;
};

class BatteryUpdateChange : public BatteryUpdate,
                            public testing::WithParamInterface<BatteryChange> {};

TEST_P(BatteryUpdateChange, IsAnErrorLineAndStoredOnce) {
    setStatus(GetParam().operational, GetParam().battery);
    watchLock();
    watchLog();
    ASSERT_EQ(updateBattery(), 0);
    EXPECT_THAT(logWithLock(), ElementsAre("free " + kEnter, GetParam().line, "free " + kExit));
    EXPECT_EQ(watchedCalls_, 2);
    EXPECT_EQ(heldCalls_, 0);
    expectStatus(GetParam().operational, GetParam().battery);

    CapturedSyslog::clear();
    ASSERT_EQ(updateBattery(), 0);
    EXPECT_THAT(logLines(), ElementsAre(kEnter, kExit));
}

INSTANTIATE_TEST_SUITE_P(
    Battery, BatteryUpdateChange,
    testing::Values(
        BatteryChange{"Battery", 11, 4,
                      "held ERR CheckAndUpdateBatteryInfo: battery X1 status changed. Old "
                      "OperationalStatus 11 BatteryStatust 7, new OperationalStatus 11 "
                      "BatteryStatust 4\n"},
        BatteryChange{"Operational", 6, 7,
                      "held ERR CheckAndUpdateBatteryInfo: battery X1 status changed. Old "
                      "OperationalStatus 11 BatteryStatust 7, new OperationalStatus 6 "
                      "BatteryStatust 7\n"},
        BatteryChange{"Both", 3, 5,
                      "held ERR CheckAndUpdateBatteryInfo: battery X1 status changed. Old "
                      "OperationalStatus 11 BatteryStatust 7, new OperationalStatus 3 "
                      "BatteryStatust 5\n"},
        BatteryChange{"Swapped", 7, 11,
                      "held ERR CheckAndUpdateBatteryInfo: battery X1 status changed. Old "
                      "OperationalStatus 11 BatteryStatust 7, new OperationalStatus 7 "
                      "BatteryStatust 11\n"}),
    [](const auto& given) { return given.param.label; });

TEST_F(BatteryUpdate, TakesMissingStatusAsZero) {
    repository.eraseProperty(path_, "OperationalStatus");
    repository.eraseProperty(path_, "BatteryStatus");
    ASSERT_EQ(updateBattery(), 0);
    expectStatus(0, 0);
}

TEST_F(BatteryUpdate, WithoutAFreshInstanceFetchesIt) {
    setStatus(6, 4);
    ASSERT_EQ(updateBattery(nullptr), 0);
    EXPECT_THAT(brokerCalls(), ElementsAre("getInstance " + kBattery));
    EXPECT_EQ(logLines()[1], kGet);
    expectStatus(6, 4);
}

TEST_F(BatteryUpdate, OfABatteryThatCannotBeFetchedOnlyStamps) {
    setStatus(6, 4);
    faults().add(refusal(Entry::GetInstance, CMPI_RC_ERR_FAILED, "discharged"));
    ASSERT_EQ(updateBattery(nullptr), 0);
    EXPECT_THAT(logLines(),
                ElementsAre(kEnter, kGet,
                            "ERR GetInstance " + kBattery + " failed, status: rc 1, msg discharged",
                            kExit));
    expectStatus(11, 7);
}

TEST_F(BatteryUpdate, FailingWithoutMessageSaysNull) {
    faults().add(refusal(Entry::GetInstance, CMPI_RC_ERR_NOT_SUPPORTED));
    ASSERT_EQ(updateBattery(nullptr), 0);
    EXPECT_TRUE(logged(LOG_ERR, "GetInstance " + kBattery + " failed, status: rc 7, msg NULL"));
}

TEST_F(BatteryUpdate, OfABatteryAnsweredNullOnlyStamps) {
    setStatus(6, 4);
    faults().add(answerNull(Entry::GetInstance));
    ASSERT_EQ(updateBattery(nullptr), 0);
    EXPECT_THAT(logLines(), ElementsAre(kEnter, kGet, kExit));
    expectStatus(11, 7);
}

TEST_F(BatteryUpdate, OfARemovedBatteryOnlyStamps) {
    repository.remove(path_);
    ASSERT_EQ(updateBattery(nullptr), 0);
    expectStatus(11, 7);
}

TEST_F(BatteryUpdate, StampsAfterReading) {
    faults().add(watch(Entry::InstanceGetProperty, [] { VirtualClock::advance(1); }));
    ASSERT_EQ(updateBattery(), 0);
    EXPECT_EQ(ctrl->BatteryUpdateTime, kLater + 2);
}

TEST_F(BatteryUpdate, WaitsForTheLockBeforeItChangesAnything) {
    setStatus(6, 4);
    updateWhileLockIsTaken(CheckAndUpdateBatteryInfo, record(), nullptr, 1, [&] {
        EXPECT_EQ(record()->OperationalStatus, 11);
        EXPECT_EQ(record()->BatteryStatus, 7);
        EXPECT_EQ(CapturedSyslog::countContaining("status changed"), 0u);
    });
    expectStatus(6, 4);
}

}  // namespace
}  // namespace plexortest
