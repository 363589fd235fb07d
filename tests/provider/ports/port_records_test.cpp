// SAS/SATA ports: filled from one instance, never read again.
#include "device_kinds.h"
#include "odd_values.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testing::ElementsAre;
using testing::IsEmpty;

class PortTest : public KindTest<PortKind> {
protected:
    const std::string kPort =
        "root/sample:Sample_SASSATAPort.SystemCreationClassName=\"Sample_ComputerSystem\","
        "SystemName=\"sample\",CreationClassName=\"Sample_SASSATAPort\",DeviceID=\"X1\"";

    void SetUp() override {
        KindTest::SetUp();
        repository.setProperty(path_, "ElementName", CimValue::string("SAS port 1"));
        repository.setProperty(path_, "PortType", CimValue::uint16(94));
        repository.setProperty(path_, "UsageRestriction", CimValue::uint16(3));
        repository.setProperty(path_, "OperationalStatus", CimValue::uint16Array({15, 2}));
    }
    int updatePort(CMPIInstance* fresh) { return update(CheckAndUpdatePortInfo, record(), fresh); }
    AddressNames names() const {
        AddressNames known = {{ctrl->PortList, "ports"}};
        if (record() != nullptr) known.emplace_back(record(), "port");
        return known;
    }
};

using PortBuild = PortTest;

TEST_F(PortBuild, HoldsWhatTheVendorSays) {
    ASSERT_EQ(buildIt(), 0);
    EXPECT_STREQ(record()->DeviceID, "X1");
    EXPECT_STREQ(record()->PortName, "SAS port 1");
    EXPECT_EQ(record()->PortType, 94);
    EXPECT_EQ(record()->UsageRestriction, 3);
    EXPECT_EQ(record()->OperationalStatus, 15);
}

TEST_F(PortBuild, AsksNothing) {
    ASSERT_EQ(buildIt(), 0);
    EXPECT_THAT(brokerCalls(), IsEmpty());
}

TEST_F(PortBuild, ReadsThePropertiesInOrder) {
    books().recordObjectCalls(true);
    ASSERT_EQ(buildIt(), 0);
    EXPECT_THAT(propertiesRead("Sample_SASSATAPort"),
                ElementsAre("DeviceID", "ElementName", "PortType", "UsageRestriction",
                            "OperationalStatus"));
}

TEST_F(PortBuild, LogsEveryStepAndHoldsTheLockForTheInsertionOnly) {
    watchLock();
    watchLog();
    ASSERT_EQ(buildIt(), 0);
    EXPECT_THAT(logWithLock(names()),
                ElementsAre("free DEBUG BuildPortInfo, ENTER...\n",
                            "free INFO \nPortOp: " + kPort +
                                "\n"
                                "\tDeviceID          - X1\n"
                                "\tPortName:         - SAS port 1\n"
                                "\tPortType          - 94\n"
                                "\tOperationalStatus - 15\n",
                            "held DEBUG Adding data <port> to the list <ports> at the tail\n",
                            "held DEBUG Data <port> added to the list <ports>, size 1\n",
                            "free DEBUG BuildPortInfo: port <port> added to the list\n",
                            "free DEBUG BuildPortInfo, EXIT(0).\n"));
    EXPECT_EQ(watchedCalls_, 5);
    EXPECT_EQ(heldCalls_, 0);
}

TEST_F(PortBuild, WithoutNameHasNone) {
    repository.eraseProperty(path_, "ElementName");
    ASSERT_EQ(buildIt(), 0);
    EXPECT_EQ(record()->PortName, nullptr);
    EXPECT_EQ(CapturedSyslog::countContaining("\tPortName:         - NULL\n"), 1u);
}

TEST_F(PortBuild, OddValuesCountAsNoneOrZero) {
    for (const OddValue& odd : oddTexts()) {
        SCOPED_TRACE(odd.label);
        give(path_, "ElementName", odd);
        ASSERT_EQ(buildIt(), 0);
        EXPECT_EQ(record()->PortName, nullptr);
        ASSERT_EQ(DeletePort(ctrl, record()), 0);
    }
    for (const OddValue& odd : oddNumbers()) {
        SCOPED_TRACE(odd.label);
        give(path_, "PortType", odd);
        give(path_, "UsageRestriction", odd);
        ASSERT_EQ(buildIt(), 0);
        EXPECT_EQ(record()->PortType, 0);
        EXPECT_EQ(record()->UsageRestriction, 0);
        ASSERT_EQ(DeletePort(ctrl, record()), 0);
    }
}

TEST_F(PortBuild, WithAnUncopiedNameHasNone) {
    const auto fault = FailAllocation::strdupOf("SAS port 1");
    ASSERT_EQ(buildIt(), 0);
    EXPECT_EQ(record()->PortName, nullptr);
    EXPECT_THAT(CapturedSyslog::linesAt(LOG_WARNING),
                ElementsAre("strdup() failed to duplicate string SAS port 1\n"));
    EXPECT_EQ(record()->PortType, 94);
}

TEST_F(PortBuild, WithoutMemoryForTheListEntryIsReleased) {
    watchLog();
    {
        const auto fault = FailAllocation::nth(4);
        EXPECT_EQ(buildIt(), -2);
        EXPECT_EQ(fault.failures(), 1u);
    }
    Texts lines = logWithLock(names());
    lines.erase(lines.begin(), lines.begin() + 2);
    EXPECT_THAT(lines, ElementsAre("held DEBUG Adding data <?> to the list <ports> at the tail\n",
                                   "free ERR BuildPortInfo: failed to add port to list, rc -2.\n",
                                   "free DEBUG SAS port 1 deleted\n",
                                   "free DEBUG BuildPortInfo, EXIT(-2).\n"));
    expectNothingCached();
}

TEST_F(PortBuild, SurvivesEveryFailingAllocation) {
    const std::size_t allocations = forEachFailingAllocation([&](std::size_t n) {
        SCOPED_TRACE(n);
        ctrl->PortUpdateTime = 0;
        const int rc = buildIt();
        if (rc != 0) return expectNothingCached();
        EXPECT_EQ(DeletePort(ctrl, record()), 0);
    });
    EXPECT_EQ(allocations, 4u) << "record, identifier, name, list entry";
}

using PortUpdate = PortTest;

TEST_F(PortUpdate, LogsAndStampsUnderTheLock) {
    ASSERT_EQ(buildIt(), 0);
    VirtualClock::advance(30);
    startOver();
    ASSERT_EQ(updatePort(instanceAt(path_)), 0);
    EXPECT_THAT(logLines(), ElementsAre("DEBUG CheckAndUpdatePortInfo: ENTER. port - SAS port 1\n",
                                        "DEBUG CheckAndUpdatePortInfo, exit.\n"));
    EXPECT_EQ(ctrl->PortUpdateTime, kStart + 30);
}

TEST_F(PortUpdate, OfANamelessPortPassesTheNull) {
    repository.eraseProperty(path_, "ElementName");
    ASSERT_EQ(buildIt(), 0);
    startOver();
    ASSERT_EQ(updatePort(nullptr), 0);
    EXPECT_THAT(logLines(), ElementsAre("DEBUG CheckAndUpdatePortInfo: ENTER. port - (null)\n",
                                        "DEBUG CheckAndUpdatePortInfo, exit.\n"));
}

TEST_F(PortUpdate, ReadsNothing) {
    ASSERT_EQ(buildIt(), 0);
    repository.setProperty(path_, "OperationalStatus", CimValue::uint16Array({6}));
    repository.setProperty(path_, "ElementName", CimValue::string("renamed"));
    repository.setProperty(path_, "PortType", CimValue::uint16(1));
    repository.setProperty(path_, "UsageRestriction", CimValue::uint16(1));
    books().recordObjectCalls(true);
    CMPIInstance* const given[] = {instanceAt(path_), nullptr};
    for (CMPIInstance* fresh : given) {
        startOver();
        ASSERT_EQ(updatePort(fresh), 0);
        EXPECT_THAT(books().calls(), IsEmpty());
    }
    EXPECT_EQ(record()->OperationalStatus, 15);
    EXPECT_STREQ(record()->PortName, "SAS port 1");
    EXPECT_EQ(record()->PortType, 94);
    EXPECT_EQ(record()->UsageRestriction, 3);
}

}  // namespace
}  // namespace plexortest
