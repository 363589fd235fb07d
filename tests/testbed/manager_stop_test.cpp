// How managers stop: what becomes of up-calls, how often cleanup comes, who asks meanwhile.
#include "manager_stop.h"

#include <atomic>
#include <thread>

#include "manager_fixture.h"

namespace testbed {
namespace {

using std::chrono::milliseconds;

class ManagerStops : public ManagerTest {
protected:
    static CMPIrc query(Manager& manager, const CMPIContext* ctx) {
        CMPIStatus status = unsetStatus();
        manager.calls().enumerateInstanceNames(
            manager.handle(), ctx,
            manager.makers().newObjectPath(manager.handle(), "root/sample", "CIM_Drive", nullptr),
            &status);
        return status.rc;
    }
    /// Stops a provider whose cleanup takes that long. How often cleanup was called.
    static std::size_t stop(const std::string& words, milliseconds cleanup,
                            const std::function<void()>& request = {}) {
        Manager manager(words);
        ProviderLibrary library(manager.broker, SAMPLE_PROVIDER, "Sample");
        FaultRule slow;
        slow.entry = Entry::NewString;  // the sample's cleanup makes one
        slow.delay = cleanup;
        manager.broker.faults().add(slow);
        EXPECT_EQ(stopAndUnload(manager.broker, library, request, milliseconds(200)), CMPI_RC_OK);
        EXPECT_FALSE(library.isOpen());
        return manager.broker.books().count(Entry::NewString);
    }
};

TEST_F(ManagerStops, RefusedUpCalls) {
    for (const bool refuses : {false, true}) {
        Manager manager(refuses ? "refuse-at-stop" : "host");
        EXPECT_EQ(query(manager, manager.context()), CMPI_RC_OK);
        manager.broker.beginStop();
        EXPECT_EQ(query(manager, manager.context()), refuses ? CMPI_RC_ERR_FAILED : CMPI_RC_OK);
        manager.broker.endStop();
        EXPECT_EQ(query(manager, manager.context()), CMPI_RC_OK);
    }
}

TEST_F(ManagerStops, UnansweredUpCalls) {
    for (const bool silent : {false, true}) {
        Manager manager(silent ? "silent-at-stop" : "host");
        manager.broker.beginStop();
        std::atomic<CMPIrc> answer = CMPI_RC_ERROR;
        std::thread asker([&] {
            const Broker::CallScope scope(manager.broker);
            answer = query(manager, scope.context());
        });
        if (!silent) asker.join();
        std::this_thread::sleep_for(milliseconds(silent ? 100 : 0));
        EXPECT_EQ(answer, silent ? CMPI_RC_ERROR : CMPI_RC_OK);
        manager.broker.endStop();
        if (asker.joinable()) asker.join();
        EXPECT_EQ(answer, silent ? CMPI_RC_ERR_FAILED : CMPI_RC_OK);
    }
}

TEST_F(ManagerStops, RepeatedStops) {
    EXPECT_EQ(stop("host", milliseconds(300)), 1u);
    EXPECT_GE(stop("repeated-stop", milliseconds(1000)), 3u);
}

TEST_F(ManagerStops, RequestsMeanwhile) {
    for (const bool asked : {false, true}) {
        std::atomic<int> requests = 0;
        stop(asked ? "requests-at-stop" : "host", milliseconds(100), [&] {
            ++requests;
            std::this_thread::sleep_for(milliseconds(1));
        });
        EXPECT_EQ(requests > 0, asked);
    }
}

TEST_F(ManagerStops, ThreadOfTheProvidersMayLeaveAfterwards) {
    Manager manager("silent-at-stop");
    CMPIContext* prepared =
        manager.calls().prepareAttachThread(manager.handle(), manager.context());
    EXPECT_FALSE(manager.broker.waitUntilUnused(milliseconds(20)));
    std::thread worker([&] {
        manager.calls().attachThread(manager.handle(), prepared);
        std::this_thread::sleep_for(milliseconds(50));
        manager.calls().detachThread(manager.handle(), prepared);
    });
    EXPECT_TRUE(manager.broker.waitUntilUnused(std::chrono::seconds(60)));
    worker.join();
}

}  // namespace
}  // namespace testbed
