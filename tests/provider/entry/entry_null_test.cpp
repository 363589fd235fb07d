// Every broker call inside the factory, failed one at a time: refused, answered with nothing, or
// with something else than asked for; and every allocation.
#include <string>
#include <vector>

#include "entry_fixture.h"
#include "refresh_fixture.h"

namespace {

using plexortest::CapturedSyslog;
using plexortest::FailAllocation;
using plexortest::WorkersHeld;
using testbed::Entry;

/// What a broker call answers instead of the truth.
struct Answer {
    const char* name;
    CMPIrc rc;
    bool null;
    bool wrongType;
};

constexpr Answer kAnswers[] = {
    {"refused", CMPI_RC_ERR_FAILED, true, false},
    {"nothing, with status OK", CMPI_RC_OK, true, false},
    {"a number", CMPI_RC_OK, false, true},
};

constexpr Entry kEntries[] = {
    Entry::NewObjectPath,       Entry::EnumerateInstances,    Entry::Associators,
    Entry::StringGetCharPtr,    Entry::ArrayGetSize,          Entry::ArrayGetElementAt,
    Entry::EnumerationHasNext,  Entry::EnumerationGetNext,    Entry::EnumerationToArray,
    Entry::InstanceGetProperty, Entry::InstanceGetObjectPath, Entry::PathGetKey,
    Entry::PathGetClassName,    Entry::PathToString,          Entry::Clone,
};

class FactoryFaultsTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        vendor.host();
        const plexortest::VendorController controller = vendor.controller("C0", vendor.profile());
        vendor.software(controller.system, 10, "1.0");
        vendor.software(controller.system, 2, "2.0");
    }

    void callAndCheck() {
        CMPIStatus status = {CMPI_RC_ERR_QUERY_FEATURE_NOT_SUPPORTED, nullptr};
        books().clearCalls();
        const CMPIInstanceMI* made = callFactory(&status);
        ASSERT_NE(made, nullptr);
        EXPECT_EQ(made->ft, &instMIFT__);
        EXPECT_EQ(status.rc, CMPI_RC_ERR_QUERY_FEATURE_NOT_SUPPORTED);
        // Its own context, and those of workers that could not be started.
        EXPECT_GE(countHere(Entry::AttachThread), 1u);
        EXPECT_EQ(countHere(Entry::DetachThread), countHere(Entry::AttachThread));
        EXPECT_EQ(countHere(Entry::ContextFlush), plexortest::kContextHasFlush ? 1u : 0u);
        expectConsistentState();
    }
    void expectConsistentState() {
        if (initialized() == 0) {
            EXPECT_EQ(controllers(), 0u);
            EXPECT_EQ(GetSystemName(), nullptr);
        }
        EXPECT_LE(controllers(), 1u);
        if (controllers() == 1) {
            EXPECT_STREQ(firstController()->DeviceID, "C0");
        }
    }
    /// Requests are answered, whatever was built; then everything goes.
    void serveAndUnload() {
        testbed::InstanceClient client(broker, &mi);
        settleWorkers();
        const std::size_t there = controllers();
        const testbed::Response response = client.enumerateInstances("Tovexa_PlexorController");
        EXPECT_EQ(response.rc, 0);
        EXPECT_EQ(response.instances.size(), there);
        EXPECT_EQ(client.enumerateInstances("Tovexa_PlexorStorageVolume").rc, 0);
        unloadAndForget();
        EXPECT_EQ(books().liveClones(), 0u);
        EXPECT_EQ(books().misuses(), std::vector<std::string>{});
    }
};

class EntryNullTest : public FactoryFaultsTest, public ::testing::WithParamInterface<Entry> {
protected:
    static testbed::FaultRule ruleFor(const Answer& answer) {
        testbed::FaultRule rule;
        rule.entry = GetParam();
        rule.rc = answer.rc;
        rule.nullResult = answer.null;
        rule.wrongType = answer.wrongType;
        return rule;
    }
    /// Calls the factory while the workers are held, with that answer to `times` calls from number
    /// `call` on, and says whether the fault was met.
    bool meetsFault(const Answer& answer, int call, int times) {
        bool met = false;
        testbed::FaultRule rule = ruleFor(answer);
        rule.skip = call;
        rule.times = times;
        rule.hook = [&met] { met = true; };
        faults().add(rule);
        const WorkersHeld held;
        callAndCheck();
        faults().clear();
        return met;
    }
    /// Lets the answers begin at every call in turn.
    void copeFromEveryCallOn(int times) {
        for (const Answer& answer : kAnswers) {
            for (int call = 0; call < 200; call++) {
                SCOPED_TRACE(std::string(answer.name) + " at call " + std::to_string(call));
                const bool met = meetsFault(answer, call, times);
                serveAndUnload();
                if (HasFailure()) return;
                if (!met) break;
                ASSERT_LT(call, 199) << "more calls than this test expects";
            }
        }
    }
};

TEST_P(EntryNullTest, FactoryCopesWithEveryAnswer) {
    copeFromEveryCallOn(1);
}

// The same answer to a call and to all after it, so that every loop is begun and then starved.
TEST_P(EntryNullTest, FactoryCopesWithTheSameAnswerForEver) {
    copeFromEveryCallOn(-1);
}

INSTANTIATE_TEST_SUITE_P(Entries, EntryNullTest, ::testing::ValuesIn(kEntries),
                         [](const auto& tested) {
                             std::string name = testbed::entryName(tested.param);
                             std::erase(name, '.');
                             return name;
                         });

class EntryNoMemoryTest : public FactoryFaultsTest {};

// Records, copies, list entries, start-up records of workers, work items.
TEST_F(EntryNoMemoryTest, FactoryCopesWithEveryFailingAllocation) {
    std::size_t allocations = 0;
    for (bool failed = true; failed; allocations++) {
        SCOPED_TRACE("allocation " + std::to_string(allocations + 1));
        {
            const WorkersHeld held;
            const auto fault = FailAllocation::nth(allocations + 1);
            callAndCheck();
            failed = fault.failures() != 0;
        }
        serveAndUnload();
        if (HasFailure()) return;
    }
    // At least: three names, the controller with its texts, its entry, two workers, one item.
    EXPECT_GT(allocations, 12u);
}

class EntryEmptyAnswersTest : public plexortest::EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        presentVendor();
    }
    testbed::FaultRule nothing(Entry entry, const char* className) {
        testbed::FaultRule rule;
        rule.entry = entry;
        rule.className = className;
        rule.nullResult = true;
        return rule;
    }
};

TEST_F(EntryEmptyAnswersTest, NoEnumerationOfHostsIsNoIdentity) {
    faults().add(nothing(Entry::EnumerateInstances, "OMC_UnitaryComputerSystem"));
    callFactory();
    EXPECT_TRUE(plexortest::logged(LOG_ERR, "Cannot get system info, rc -100\n"));
    EXPECT_EQ(initialized(), 0);
}

TEST_F(EntryEmptyAnswersTest, NoEnumerationOfProfilesIsNoProfile) {
    faults().add(nothing(Entry::EnumerateInstances, "CIM_RegisteredProfile"));
    callFactory();
    EXPECT_TRUE(
        plexortest::logged(LOG_INFO, "No instance of Host Hard RAID Controller is found, rc 0\n"));
    EXPECT_EQ(initialized(), 0);
    EXPECT_EQ(GetSystemName(), nullptr);
}

TEST_F(EntryEmptyAnswersTest, NoEnumerationOfControllersIsAnEmptyInventory) {
    testbed::FaultRule rule;
    rule.entry = Entry::Associators;
    rule.assocClass = "CIM_ElementConformsToProfile";
    rule.nullResult = true;
    faults().add(rule);
    callFactory();
    EXPECT_EQ(initialized(), 1);
    EXPECT_EQ(controllers(), 0u);
    EXPECT_EQ(CapturedSyslog::countContaining("failed, status"), 0u);
}

}  // namespace
