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
    testbed::FaultRule waitingAt(testbed::Entry entry, Gate& gate) {
        testbed::FaultRule rule;
        rule.entry = entry;
        rule.times = 1;
        rule.hook = [&gate] { gate.pass(); };
        return rule;
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
    static bool cleanupsInside(std::size_t count) {
        return soon([count] {
            return CapturedSyslog::count("PlexorProviderCleanup: ENTER...\n") == count;
        });
    }
    template <class Future>
    static bool stillWaits(const Future& future) {
        return future.wait_for(std::chrono::milliseconds(30)) == std::future_status::timeout;
    }
};

}  // namespace plexortest
