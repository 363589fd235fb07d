// Whole lives of the provider in which one thing goes wrong: each allocation in turn and each call
// to the broker in turn, once, and from then on. Whatever happens, the provider answers, comes to
// rest, unloads, and leaves nothing behind.
//
// Every 11th of these lives; with PLEXOR_LONG in the environment all of them, which takes minutes.
#include <map>

#include "entry_fixture.h"

// A volume that is turned away for want of a pool leaves its copies behind on purpose.
extern "C" const char* __lsan_default_suppressions() {
    return "leak:BuildVolumeInfo\n";
}

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;

constexpr const char* kClasses[] = {
    "Tovexa_PlexorController",    "Tovexa_PlexorSoftwareIdentity", "Tovexa_PlexorStorageVolume",
    "Tovexa_PlexorStorageExtent", "Tovexa_PlexorSASSATAPort",      "Tovexa_PlexorBattery",
};

std::size_t stride() {
    return getenv("PLEXOR_LONG") != nullptr ? 1 : 11;
}

class Faults : public EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        books().recordObjectCalls(true);
        presentVendor();
        vendor.chassis({}, "C0_E1");
    }
    void TearDown() override {
        expectLeftClones(books().liveClones());
        EntryTest::TearDown();
    }

    void ask() {
        testbed::InstanceClient client(broker, &mi);
        for (const char* name : kClasses) {
            const testbed::Response names = client.enumerateInstanceNames(name);
            client.enumerateInstances(name);
            for (const auto& path : names.paths) client.getInstance(path);
        }
    }
    /// Loads, asks, changes the array, asks until it is refreshed, and asks once more.
    void work() {
        callFactory();
        // The inventory has been taken then, or never was queued.
        EXPECT_TRUE(atRest());
        changeArray();
        for (int round = 0; round < 2; round++) {
            VirtualClock::advance(25);
            ask();
            EXPECT_TRUE(atRest());
        }
        restoreArray();
    }
    static bool hasWorkers() { return PlexorThreads[0] != 0 || PlexorThreads[1] != 0; }
    static bool atRest() { return !hasWorkers() || WorkersMeet::untilIdle(); }
    /// A drive goes, another comes, a volume degrades.
    void changeArray() {
        const auto drive = vendor.devicePath("CIM_DiskDrive", "d1");
        gone_ = repository.get(drive);
        repository.remove(drive);
        const auto volume = vendor.devicePath("CIM_StorageVolume", "v1");
        repository.setProperty(volume, "ExtentStatus", testbed::CimValue::uint16Array({16}));
    }
    void restoreArray() {
        repository.put(*gone_);
        const auto volume = vendor.devicePath("CIM_StorageVolume", "v1");
        repository.setProperty(volume, "ExtentStatus", testbed::CimValue::uint16Array({2}));
    }
    /// One life with `fault` in place; what it leaves behind is looked for after it.
    template <class Fault>
    void live(Fault fault) {
        VirtualClock::reset(kStart);
        {
            [[maybe_unused]] const auto armed = fault();
            work();
        }
        faults().clear();
        unloadAndForget();
        expectNothingLeft();
        books().clearCalls();
    }
    void expectNothingLeft() {
        EXPECT_EQ(controllers(), 0u);
        EXPECT_TRUE(IsFifoEmpty(&__FIFO));
        EXPECT_EQ(books().misuses(), std::vector<std::string>{});
        // A volume that is turned away leaves its path behind, and nothing else does.
        turnedAway_ += CapturedSyslog::countContaining("No pool associated with volume ") +
                       CapturedSyslog::countContaining("failed to add volume to list");
        EXPECT_LE(books().liveClones(), turnedAway_);
        CapturedSyslog::clear();
    }
    /// Calls of every entry in a life without a fault.
    std::map<Entry, std::size_t> callsOfALife() {
        std::map<Entry, std::size_t> calls;
        live([] { return 0; });
        work();
        for (const testbed::CallRecord& call : books().calls()) calls[call.entry]++;
        unloadAndForget();
        return calls;
    }

private:
    std::optional<testbed::Instance> gone_;
    std::size_t turnedAway_ = 0;
};

TEST_F(Faults, ALifeWithoutAFaultSeesEverything) {
    callFactory();
    ASSERT_TRUE(inventoryTaken());
    testbed::InstanceClient client(broker, &mi);
    for (const char* name : kClasses) {
        if (std::string_view(name) == "Tovexa_PlexorSoftwareIdentity") continue;
        EXPECT_EQ(client.enumerateInstances(name).instances.size(), 1u) << name;
    }
    unloadAndForget();
    EXPECT_EQ(books().liveClones(), 0u);
    expectNothingLeft();
}
TEST_F(Faults, EachAllocation) {
    std::size_t allocations = 0;
    live([&] { return FailAllocation::none(); });
    {
        const auto counting = FailAllocation::none();
        work();
        allocations = counting.calls();
    }
    unloadAndForget();
    ASSERT_GT(allocations, 50u);
    for (std::size_t n = 1; n <= allocations; n += stride()) {
        SCOPED_TRACE("allocation " + std::to_string(n));
        live([n] { return FailAllocation::nth(n); });
        live([n] { return FailAllocation::from(n); });
    }
}

/// How a call goes wrong.
struct Wrong {
    const char* name;
    CMPIrc rc;
    bool nullResult;
    bool wrongType;
};

class BrokerFaults : public Faults, public testing::WithParamInterface<Wrong> {};

TEST_P(BrokerFaults, EachCall) {
    const std::map<Entry, std::size_t> calls = callsOfALife();
    std::size_t number = 0;
    for (const auto& [entry, count] : calls) {
        // A manager that refuses to take an object back keeps it; that is its own affair.
        if (entry == Entry::Release) continue;
        // Nor does the provider ask whether a thread was attached; the books call what follows
        // misuse.
        if (entry == Entry::AttachThread) continue;
        for (std::size_t n = 0; n < count; n++) {
            if (number++ % stride() != 0) continue;
            for (const int times : {1, -1}) {
                SCOPED_TRACE(std::string(testbed::entryName(entry)) + " " + std::to_string(n) +
                             (times == 1 ? " once" : " from then on"));
                FaultRule rule = refusal(entry, GetParam().rc);
                rule.nullResult = GetParam().nullResult;
                rule.wrongType = GetParam().wrongType;
                rule.skip = static_cast<int>(n);
                rule.times = times;
                live([&] { return faults().add(rule); });
            }
        }
    }
    EXPECT_GT(number, 100u);
}

INSTANTIATE_TEST_SUITE_P(All, BrokerFaults,
                         testing::Values(Wrong{"Refused", CMPI_RC_ERR_FAILED, true, false},
                                         Wrong{"NothingWithOk", CMPI_RC_OK, true, false},
                                         Wrong{"NumberInstead", CMPI_RC_OK, false, true}),
                         [](const auto& param) { return param.param.name; });

}  // namespace
}  // namespace plexortest
