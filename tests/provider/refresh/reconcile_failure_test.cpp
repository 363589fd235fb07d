// Refreshes that fail: logged, the cache as it was, and no second try before the next interval.
#include <optional>
#include <string>

#include "reconcile_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

class ReconcileFailure : public ReconcileTest {
protected:
    void SetUp() override {
        ReconcileTest::SetUp();
        addPort("P0");
        process(102);
        addPort("P1");
        VirtualClock::set(kStart + 100);
        clearLog();
        books().clearCalls();
    }
    /// The cached port is still there, the new one is not, and the class is stamped.
    void expectOldCacheAndStamp() {
        EXPECT_EQ(ports(), Ids{"P0"});
        EXPECT_EQ(ctrl->PortUpdateTime, kStart + 100);
        EXPECT_TRUE(loggedOnce(LOG_DEBUG, "ProcessDeviceConfigChange, EXIT\n"));
        EXPECT_EQ(CapturedSyslog::countContaining("removecount"), 0u);
        process(102);
        EXPECT_EQ(walks().size(), 1u) << "asked again before the next interval";
    }
    /// A walk that is refused like this leaves one error line, which ends so.
    void expectLogged(CMPIrc rc, const std::optional<std::string>& message, const char* end) {
        FaultRule refused = walkOver("CIM_SASSATAPort");
        refused.rc = rc;
        refused.message = message;
        faults().add(refused);
        EXPECT_EQ(process(102), 0);
        EXPECT_TRUE(loggedOnce(LOG_ERR, formatted("Associators %s (assocClass: CIM_SystemDevice, "
                                                  "resultClass: CIM_SASSATAPort) failed, %s",
                                                  kSystemText, end)));
        EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR).size(), 1u);
        expectOldCacheAndStamp();
    }
};

TEST_F(ReconcileFailure, ARefusedWalkIsLoggedWithItsMessage) {
    expectLogged(CMPI_RC_ERR_FAILED, "array is rebooting", "status: rc 1, msg array is rebooting");
}

TEST_F(ReconcileFailure, ARefusedWalkWithoutMessage) {
    expectLogged(CMPI_RC_ERR_NOT_SUPPORTED, {}, "status: rc 7, msg NULL");
}

TEST_F(ReconcileFailure, ResultsOfARefusedWalkAreNotUsed) {
    FaultRule refused = walkOver("CIM_SASSATAPort");
    refused.rc = CMPI_RC_ERR_FAILED;
    refused.keepResult = true;
    faults().add(refused);
    EXPECT_EQ(process(102), 0);
    EXPECT_EQ(CapturedSyslog::linesAt(LOG_ERR).size(), 1u);
    expectOldCacheAndStamp();
}

TEST_F(ReconcileFailure, NoEnumerationIsNoFailure) {
    FaultRule nothing = walkOver("CIM_SASSATAPort");
    nothing.nullResult = true;
    faults().add(nothing);
    EXPECT_EQ(process(102), 0);
    EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
    expectOldCacheAndStamp();
}

TEST_F(ReconcileFailure, NoArrayOfTheResults) {
    FaultRule noArray;
    noArray.entry = Entry::EnumerationToArray;
    noArray.nullResult = true;
    faults().add(noArray);
    EXPECT_EQ(process(102), 0);
    EXPECT_TRUE(loggedOnce(LOG_ERR, "CrossoutDuplicatedEntries, failed to get array from enum\n"));
    expectOldCacheAndStamp();
}

TEST_F(ReconcileFailure, NoMemoryToMatch) {
    for (const int which : {1, 2}) {
        SCOPED_TRACE(which);
        {
            const auto fault = FailAllocation::nth(which);
            EXPECT_EQ(process(102), 0);
            EXPECT_EQ(fault.failures(), 1u);
        }
        EXPECT_EQ(ports(), Ids{"P0"});
        EXPECT_EQ(ctrl->PortUpdateTime, VirtualClock::now());
        VirtualClock::advance(20);
    }
    EXPECT_EQ(process(102), 0);
    EXPECT_EQ(ports(), (Ids{"P0", "P1"}));
}

TEST_F(ReconcileFailure, TheFailureIsOverAfterTheInterval) {
    FaultRule refused = walkOver("CIM_SASSATAPort");
    refused.rc = CMPI_RC_ERR_FAILED;
    refused.times = 1;
    faults().add(refused);
    process(102);
    VirtualClock::advance(19);
    process(102);
    EXPECT_EQ(ports(), Ids{"P0"});
    VirtualClock::advance(1);
    process(102);
    EXPECT_EQ(ports(), (Ids{"P0", "P1"}));
}

TEST_F(ReconcileFailure, AFailedDependencyDoesNotStopTheChain) {
    const Path pool = addPool("pool0");
    addDrive("D0", pool);
    addVolume("V0", pool);
    FaultRule refused = walkOver("CIM_StoragePool");
    refused.rc = CMPI_RC_ERR_FAILED;
    faults().add(refused);

    EXPECT_EQ(process(101), 0);

    EXPECT_EQ(pools(), Ids{});
    EXPECT_EQ(drives(), Ids{"D0"});
    EXPECT_EQ(volumes(), Ids{"V0"});
    EXPECT_EQ(ctrl->PoolUpdateTime, kStart + 100);
}

TEST_F(ReconcileFailure, AControllerWithoutPathIsShownAsNullAndStamped) {
    ctrl->ControllerOp->ft->release(ctrl->ControllerOp);
    ctrl->ControllerOp = nullptr;

    EXPECT_EQ(process(102), 0);

    EXPECT_TRUE(loggedOnce(LOG_DEBUG,
                           "ProcessDeviceConfigChange, CIM Query - Associators: NULL "
                           "(assocClass: CIM_SystemDevice, resultClass: CIM_SASSATAPort)"));
    EXPECT_EQ(ports(), Ids{"P0"});
    EXPECT_EQ(ctrl->PortUpdateTime, kStart + 100);
}

TEST_F(ReconcileFailure, AnyAllocationMayFailWithoutLossOrLeak) {
    const Path pool = addPool("pool0");
    addDrive("D0", pool);
    addBattery("B0");
    addChassis("C0_E0");
    bool reached = true;
    for (std::size_t n = 1; reached; n++) {
        RaidController_t* const another = newController("C0");
        another->ControllerOp = clonedPath(system_);
        {
            const auto fault = FailAllocation::nth(n);
            for (const int action : {100, 102, 103, 105}) {
                EXPECT_EQ(ProcessDeviceConfigChange(&mi, ctx(), another, action), 0);
            }
            reached = fault.failures() == 1;
            EXPECT_TRUE(reached || n > 20) << "hardly any allocation was reached";
        }
        for (auto field : {&RaidController_t::DiskUpdateTime, &RaidController_t::PortUpdateTime,
                           &RaidController_t::BatteryUpdateTime, &RaidController_t::PoolUpdateTime,
                           &RaidController_t::ChassisUpdateTime}) {
            EXPECT_EQ(another->*field, kStart + 100) << "allocation " << n;
        }
        // The next pass makes up for what failed.
        for (auto field : kClassTimes) another->*field = 0;
        for (const int action : {100, 102, 103, 105}) {
            ProcessDeviceConfigChange(&mi, ctx(), another, action);
        }
        EXPECT_EQ(ids(another->DiskList, &DiskDrive_t::DeviceID), Ids{"D0"}) << "allocation " << n;
        EXPECT_EQ(another->PortList->Size, 2u);
        EXPECT_EQ(another->PoolList->Size + another->BatteryList->Size + another->ChassisList->Size,
                  3u);
        FreeController(another);
    }
}

}  // namespace
}  // namespace plexortest
