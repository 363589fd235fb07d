// The provider's calls made by the manager on several threads.
#pragma once

#include <future>

#include "PlexorProviderCfg.h"
#include "entry_fixture.h"
#include "real_waits.h"
#include "worker_harness.h"

namespace plexortest {

class MeetingTest : public EntryTest {
protected:
    void SetUp() override {
        EntryTest::SetUp();
        presentVendor();
    }
    void load() {
        callFactory();
        ASSERT_TRUE(inventoryTaken());
        settleWorkers();
        CapturedSyslog::clear();
    }
    std::future<std::size_t> requestDrives() {
        return std::async(std::launch::async, [this] {
            return testbed::InstanceClient(broker, &mi)
                .enumerateInstances("Tovexa_PlexorStorageExtent")
                .instances.size();
        });
    }
    std::future<CMPIrc> cleanUpElsewhere(bool terminating = false) {
        return std::async(std::launch::async, [this, terminating] {
            return testbed::InstanceClient(broker, &mi).cleanup(terminating);
        });
    }
    std::future<CMPIInstanceMI*> callFactoryElsewhere() {
        return std::async(std::launch::async, [this] {
            const testbed::Broker::CallScope scope(broker);
            return PlexorProvider_Create_InstanceMI(broker.handle(), scope.context(), nullptr);
        });
    }
    /// A factory call that has come as far as asking for the profiles, and waits there.
    std::future<CMPIInstanceMI*> factoryHeldAtTheProfiles(Gate& gate) {
        testbed::FaultRule slow = waitingAt(testbed::Entry::EnumerateInstances, gate);
        slow.className = "CIM_RegisteredProfile";
        faults().add(slow);
        auto factory = callFactoryElsewhere();
        EXPECT_TRUE(gate.awaitArrivals(1));
        return factory;
    }
    /// A request for the drives that has come as far as its first call of `entry`, and waits there.
    std::future<std::size_t> requestHeldAt(testbed::Entry entry, Gate& gate) {
        faults().add(waitingAt(entry, gate));
        auto request = requestDrives();
        EXPECT_TRUE(gate.awaitArrivals(1));
        return request;
    }
    /// A cleanup that has begun and waits for somebody.
    std::future<CMPIrc> cleanupThatWaits(bool terminating) {
        const std::size_t before = CapturedSyslog::count("PlexorProviderCleanup: ENTER...\n");
        auto cleanup = cleanUpElsewhere(terminating);
        EXPECT_TRUE(cleanupsInside(before + 1));
        EXPECT_TRUE(stillWaits(cleanup));
        return cleanup;
    }
    static bool cleanupsInside(std::size_t count) {
        return eventually([count] {
            return CapturedSyslog::count("PlexorProviderCleanup: ENTER...\n") == count;
        });
    }
    template <class Future>
    static bool stillWaits(const Future& future) {
        return future.wait_for(std::chrono::milliseconds(30)) == std::future_status::timeout;
    }
};

}  // namespace plexortest
