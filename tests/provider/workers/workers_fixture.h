// The provider's own two workers, started and stopped as the provider does it.
#pragma once

#include <stdio.h>
#include <stdlib.h>
#include <unistd.h>

#include <fstream>
#include <set>
#include <string>

#include "real_waits.h"
#include "refresh_fixture.h"
#include "worker_harness.h"

namespace plexortest {

class WorkersTest : public RefreshTest {
protected:
    void TearDown() override {
        stopWorkers();
        if (started_) expectNobodyLeft();
        unsetenv("PLEXOR_HOSTCONFIG_FILE");
        remove(optionFile().c_str());
        RefreshTest::TearDown();
    }

    /// Sets the host's option store to one line for the polling interval.
    static void setPollingOption(const std::string& value) {
        std::ofstream(optionFile())
            << "/UserVars/CIMtvx_plexorProviderPollingInterval = " << value << "\n";
        setenv("PLEXOR_HOSTCONFIG_FILE", optionFile().c_str(), 1);
    }

    /// Starts the workers and waits until `count` of them have found nothing to do.
    void startWorkers(std::size_t count = 2) {
        running_ = started_ = true;
        InitPlexorThreads(ctx());
        ASSERT_TRUE(eventually([&] {
            return books().count(testbed::Entry::AttachThread) >= count && idleLines() >= count;
        }));
    }

    /// Stops idle workers and joins them, as often as it takes.
    void stopWorkers() {
        if (!running_) return;
        running_ = false;
        EXPECT_TRUE(workersComeToRest());
        CleanupPlexorThreads();
    }

    /// A worker that stays behind would go on in the next test.
    static void expectNobodyLeft() {
        EXPECT_EQ(workersLeft(), 0u);
        eventually([] { return workersLeft() == 0; });
    }
    /// Number of workers that could not be joined, after another try.
    static std::size_t workersLeft() {
        const HurriedWaits hurry(HurriedWaits::Joins);
        pthread_attr_init(&PlexorThreadAttr);
        CleanupPlexorThreads();
        return HurriedWaits::joins().size();
    }

    /// How often workers have said that they wait.
    static std::size_t idleLines() {
        return CapturedSyslog::countContaining("): no item to process, wait...\n");
    }
    static std::size_t exitLines() { return CapturedSyslog::countContaining(" exiting...\n"); }

    /// Threads on which calls of that entry were made.
    std::set<std::thread::id> threadsOf(testbed::Entry entry) {
        std::set<std::thread::id> threads;
        for (const testbed::CallRecord& call : books().calls()) {
            if (call.entry == entry) threads.insert(call.thread);
        }
        return threads;
    }

    static std::string optionFile() {
        return ::testing::TempDir() + "plexor-hostconfig-" + std::to_string(getpid());
    }

    /// Makes that many workers run an item that ends when the gate opens.
    void occupyWorkers(int count, Gate& gate) {
        for (int i = 0; i < count; i++) {
            ASSERT_EQ(tasks_.queue([&gate](CMPIContext*, void*) { gate.pass(); }), 0);
        }
        ASSERT_TRUE(gate.awaitArrivals(count));
    }

    bool running_ = false;  // to be stopped
    bool started_ = false;
    Tasks tasks_;
};

/// The workers' tests with one cached controller.
class WorkersCardTest : public WorkersTest {
protected:
    void SetUp() override {
        WorkersTest::SetUp();
        card = vendor.controller("C0");
        ctrl = attach(newController("C0"));
        ctrl->ControllerOp = clonedPath(card.system);
    }
    /// Asks for a refresh of the ports that comes as far as its query, and waits there.
    void holdRefreshOfPorts(Gate& gate) {
        faults().add(watch(Entry::Associators, [&gate] { gate.pass(); }));
        ASSERT_EQ(HandleDeviceConfigChange(&mi, ctx(), ctrl, 102), 0);
        ASSERT_TRUE(gate.awaitArrivals(1));
    }

    VendorController card;
    RaidController_t* ctrl = nullptr;
};

}  // namespace plexortest
