// The factory on a host with a RAID vendor, or with less than that.
#pragma once

#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "instance_client.h"
#include "provider_fixture.h"
#include "vendor_objects.h"
#include "worker_harness.h"

namespace plexortest {

/// Keeps the workers from taking anything out of the queue for as long as it lives: they start, and
/// then wait for the mutex.
class WorkersHeld {
public:
    WorkersHeld() { pthread_mutex_lock(&PlexorThreadMutex); }
    ~WorkersHeld() { pthread_mutex_unlock(&PlexorThreadMutex); }
    WorkersHeld(const WorkersHeld&) = delete;
    WorkersHeld& operator=(const WorkersHeld&) = delete;
};

/// Where both workers meet: proof that each has come as far as taking work.
class WorkersMeet {
public:
    /// Lets `workers` of them meet and waits until all are idle again. They must have nothing to do
    /// that takes two.
    static bool letMeet(int workers) {
        arrived() = 0;
        expected() = workers;
        {
            const WorkersHeld held;
            for (int i = 0; i < workers; i++) {
                auto* item = zeroed<Thread_Args_t>();
                item->Func = arrive;
                PutItem(&__FIFO, item);
            }
            // With the mutex held no worker can miss it.
            pthread_cond_broadcast(&PlexorThreadCond);
        }
        return untilIdle() && arrived() == workers;
    }
    /// Waits until the queue is empty and no worker is active.
    static bool untilIdle() {
        return eventually([] {
            const WorkersHeld held;
            return IsFifoEmpty(&__FIFO) && ActiveThreads == 0;
        });
    }

private:
    static std::atomic<int>& arrived() {
        static std::atomic<int> count;
        return count;
    }
    static std::atomic<int>& expected() {
        static std::atomic<int> count;
        return count;
    }
    static void arrive(CMPIContext*, void* item) {
        free(item);
        ++arrived();
        eventually([] { return arrived() >= expected(); });
    }
};

/// What each first call of the factory says of the process that it is in.
inline std::string currentProcessLine() {
    return formatted("Current process:pid=%d, ppid=%d\n", getpid(), getppid());
}

class EntryTest : public ProviderTest {
protected:
    explicit EntryTest(testbed::BrokerOptions options = {}) : ProviderTest(std::move(options)) {}

    void TearDown() override {
        CapturedSyslog::onLine(nullptr);
        VirtualClock::onSleep(nullptr);
        settleWorkers();
        ProviderTest::TearDown();
    }

    /// Lets the workers that the factory started come to their first wait and end what was queued.
    /// One that has not reached it would sleep through the call to stop, one that is stopped at
    /// work would turn away the device that it is building.
    void settleWorkers() {
        const int workers = (PlexorThreads[0] != 0) + (PlexorThreads[1] != 0);
        if (workers == 0 || terminating()) return;
        EXPECT_TRUE(WorkersMeet::untilIdle());
        EXPECT_TRUE(WorkersMeet::letMeet(workers));
    }

    /// Host, profile and one controller "C0" with a volume, a drive, a port and a battery.
    void presentVendor() {
        vendor.host();
        const testbed::ObjectPath profile = vendor.profile();
        const VendorController controller = vendor.controller("C0", profile);
        const testbed::ObjectPath pool = vendor.pool(controller, "pool-1");
        vendor.volume(controller, "v1", pool);
        vendor.drive(controller, "d1", pool);
        vendor.port(controller, "p1");
        vendor.battery(controller, "b1");
    }

    /// A rule that lets the first call of `entry` wait at the gate; refine it, and add it.
    static testbed::FaultRule waitingAt(testbed::Entry entry, Gate& gate) {
        testbed::FaultRule rule;
        rule.entry = entry;
        rule.times = 1;
        rule.hook = [&gate] { gate.pass(); };
        return rule;
    }

    /// The factory, called by the manager on this thread.
    CMPIInstanceMI* callFactory(CMPIStatus* rc = nullptr) {
        return PlexorProvider_Create_InstanceMI(broker.handle(), ctx(), rc);
    }

    static unsigned int controllers() { return RaidControllerList->Size; }
    static RaidController_t* firstController() {
        const List_Entry_t* head = RaidControllerList->Head;
        return head != nullptr ? static_cast<RaidController_t*>(head->Data) : nullptr;
    }
    static int initialized() { return __atomic_load_n(&_ProviderInitialized, __ATOMIC_RELAXED); }

    static bool terminating() {
        const WorkersHeld held;
        return TerminateThread != 0;
    }

    /// Waits until the initial inventory has been taken.
    static bool inventoryTaken() {
        return eventually([] {
            const WorkersHeld held;
            return ThreadActivityDone == 1;
        });
    }

    /// Up-calls made on this thread, in order.
    std::vector<testbed::Entry> upCalls() {
        std::vector<testbed::Entry> entries;
        for (const testbed::CallRecord& call : broker.books().calls()) {
            if (call.thread == std::this_thread::get_id()) entries.push_back(call.entry);
        }
        return entries;
    }
    std::size_t countHere(testbed::Entry entry) {
        const std::vector<testbed::Entry> entries = upCalls();
        return static_cast<std::size_t>(std::count(entries.begin(), entries.end(), entry));
    }

    /// Lines logged on this thread.
    static std::vector<LogLine> linesHere() {
        std::vector<LogLine> lines = CapturedSyslog::lines();
        std::erase_if(
            lines, [](const LogLine& line) { return line.thread != std::this_thread::get_id(); });
        return lines;
    }

    /// Ends what a factory call began, as an unload does, so that the next one starts anew.
    void unloadAndForget() {
        settleWorkers();
        PlexorProviderCleanup(&mi, ctx(), 1);
        const WorkersHeld held;
        TerminateThread = 0;
        ThreadActivityDone = 0;
        PlexorThreads[0] = PlexorThreads[1] = 0;
    }

    VendorObjects vendor{repository};
};

}  // namespace plexortest
