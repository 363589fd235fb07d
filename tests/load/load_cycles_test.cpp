// Loading, using, unloading, and once more in the same process.
#include <stdlib.h>

#include <atomic>

#include "loaded_fixture.h"
#include "quick_sleep.h"

namespace {

using loadtest::QuickSleep;

class LoadCyclesTest : public loadtest::LoadTest {
protected:
    /// From the environment, for long runs.
    static int cycles() {
        const char* wanted = getenv("PLEXOR_LOAD_CYCLES");
        return wanted != nullptr ? atoi(wanted) : 20;
    }
};

// With the three seconds that an unload really takes.
TEST_F(LoadCyclesTest, LoadsWorksAndLeavesInRealTime) {
    for (int cycle = 0; cycle < 3; cycle++) {
        SCOPED_TRACE(cycle);
        const auto start = std::chrono::steady_clock::now();
        loadUseUnload();
        EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::seconds(3));
        if (HasFailure()) return;
    }
}

TEST_F(LoadCyclesTest, LoadsWorksAndLeavesManyTimes) {
    broker.books().keepCalls(false);
    const QuickSleep quick;
    for (int cycle = 0; cycle < cycles(); cycle++) {
        SCOPED_TRACE(cycle);
        loadUseUnload();
        if (HasFailure()) return;
    }
    EXPECT_GE(quick.calls(), cycles());
}

TEST_F(LoadCyclesTest, HostWithoutAVendorLeavesAtOnce) {
    repository.clearInstances();
    const QuickSleep quick;
    for (int cycle = 0; cycle < 3; cycle++) {
        testbed::ProviderLibrary library = load();
        EXPECT_TRUE(
            library.client().enumerateInstances("Tovexa_PlexorController").instances.empty());
        EXPECT_EQ(library.unload(false), 0);
        EXPECT_FALSE(isMapped());
    }
}

// A factory call for each class, then one unload.
TEST_F(LoadCyclesTest, SixFactoryCallsGiveOneInterface) {
    const QuickSleep quick;
    testbed::ProviderLibrary library = load();
    for (int i = 0; i < 5; i++) EXPECT_EQ(library.callFactory(), library.mi());
    ASSERT_TRUE(comesToRest(library));
    EXPECT_EQ(library.unload(true), 0);
}

// Another provider's refusal keeps the process; a second manager in it has a mapping of its own
// only after ours is gone.
TEST_F(LoadCyclesTest, SecondMappingStartsFromTheBeginning) {
    const QuickSleep quick;
    for (int cycle = 0; cycle < 2; cycle++) {
        testbed::ProviderLibrary library = load();
        EXPECT_EQ(guardedWord(library, "TerminateThread"), 0u);
        EXPECT_EQ(*static_cast<time_t*>(library.symbol("NextUnloadTime")), 0);
        ASSERT_TRUE(comesToRest(library));
        EXPECT_EQ(library.unload(true), 0);
    }
}

// Unloading while the vendor is slow and the devices are still being read.
TEST_F(LoadCyclesTest, LeavesWhileTheDevicesAreBeingRead) {
    const QuickSleep quick;
    for (const int milliseconds : {5, 20, 60}) {
        std::atomic<bool> reading = false;
        testbed::FaultRule slow;
        slow.entry = testbed::Entry::Associators;
        slow.assocClass = "CIM_SystemDevice";
        slow.delay = std::chrono::milliseconds(milliseconds);
        slow.hook = [&reading] { reading = true; };
        broker.faults().add(slow);
        testbed::ProviderLibrary library = load();
        ASSERT_TRUE(eventually([&] { return reading && loadtest::bothWorkersHaveWaited(); }));
        EXPECT_EQ(library.unload(false), 0);
        EXPECT_FALSE(isMapped());
        broker.faults().clear();
    }
}

}  // namespace
