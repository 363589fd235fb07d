#include "provider_fixture.h"

#include <stdlib.h>

#include <chrono>
#include <thread>

#include "PlexorProviderCfg.h"

namespace plexortest {
namespace {

void drainFifo() {
    while (auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO))) {
        if (item->Func == ProcessBuildLogicalDeviceInfo) {
            ReleaseDeviceItem(item);
        } else {
            free(item);
        }
    }
}

void resetGlobals() {
    pthread_mutex_lock(&PlexorThreadMutex);
    ActiveThreads = 0;
    TerminateThread = 0;
    ThreadActivityDone = 0;
    pthread_mutex_unlock(&PlexorThreadMutex);
    PlexorThreads[0] = PlexorThreads[1] = 0;
    __atomic_store_n(&StateUpdateInterval, 20, __ATOMIC_RELAXED);
    __atomic_store_n(&_ProviderInitialized, 0, __ATOMIC_RELAXED);
    __atomic_store_n(&NextUnloadTime, 0, __ATOMIC_RELAXED);
    __atomic_store_n(&IdleTimeBeforeTerminating, 5, __ATOMIC_RELAXED);
    __atomic_store_n(&InitCompleteTime, 0, __ATOMIC_RELAXED);
    waitDebug = 0;
}

void setBroker(const CMPIBroker* handle) {
    __atomic_store_n(&Broker, handle, __ATOMIC_RELAXED);
}

}  // namespace

ProviderTest::ProviderTest(testbed::BrokerOptions options)
    : broker(repository, std::move(options)) {}

void ProviderTest::SetUp() {
    unsetenv("WAIT_PROC");
    setenv("PLEXOR_HOSTCONFIG_FILE", "/nonexistent/hostconfig", 1);
    setlogmask(LOG_UPTO(LOG_DEBUG));
    VirtualClock::reset(kStart);
    repository.addNamespace("root/cimv2");
    repository.addNamespace("root/interop");
    scope_.emplace(broker);
    setBroker(broker.handle());
    resetGlobals();
    BeginWork();
    CapturedSyslog::reset();
}

void ProviderTest::TearDown() {
    CapturedSyslog::onLine(nullptr);
    VirtualClock::onSleep(nullptr);
    faults().clear();
    stopWorkers();
    FreeList(RaidControllerList, FreeController);
    ReleaseSystemInfo();
    drainFifo();
    EXPECT_EQ(books().liveClones(), leftClones_);
    scope_.reset();
    if (!misusesExpected_) {
        EXPECT_EQ(books().misuses(), std::vector<std::string>{});
    }
    resetGlobals();
    setBroker(nullptr);
    CapturedSyslog::reset();
}

testbed::FaultRule ProviderTest::refusal(testbed::Entry entry, CMPIrc rc,
                                         std::optional<std::string> message) {
    testbed::FaultRule rule;
    rule.entry = entry;
    rule.rc = rc;
    rule.message = std::move(message);
    return rule;
}

CMPIObjectPath* ProviderTest::clonedPath(const testbed::ObjectPath& path) {
    const CMPIObjectPath* original = broker.makePath(path);
    return original->ft->clone(original, nullptr);
}

CMPIInstance* ProviderTest::clonedInstance(const testbed::Instance& instance) {
    const CMPIInstance* original = broker.makeInstance(instance);
    return original->ft->clone(original, nullptr);
}

void ProviderTest::startWorkers() {
    InitPlexorThreads(ctx());
}

void ProviderTest::stopWorkers() {
    if (PlexorThreads[0] == 0 && PlexorThreads[1] == 0) return;
    EXPECT_TRUE(QuiesceWorkers([] { return Deadline::In(30); })) << "a work function does not end";
    // A worker that had not begun to wait misses the first call; the second takes it too.
    CleanupPlexorThreads();
    CleanupPlexorThreads();
    PlexorThreads[0] = PlexorThreads[1] = 0;
}

}  // namespace plexortest
