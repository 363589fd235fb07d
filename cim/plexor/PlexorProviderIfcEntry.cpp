// The factory, the function table and the one-time initialisation.
#include <stdlib.h>
#include <unistd.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderIfc.h"
#include "PlexorProviderIfcTurns.h"
#include "PlexorProviderLock.h"
#include "PlexorProviderUtilManager.h"

const CMPIBroker* Broker = nullptr;
int _ProviderInitialized = 0;
volatile int waitDebug = 0;
time_t InitCompleteTime = 0;

CMPIInstanceMIFT instMIFT__ = {100,
                               100,
                               "instancePlexorProvider",
                               PlexorProviderCleanup,
                               PlexorProviderEnumInstanceNames,
                               PlexorProviderEnumInstances,
                               PlexorProviderGetInstance,
                               PlexorProviderCreateInstance,
                               PlexorProviderModifyInstance,
                               PlexorProviderDeleteInstance,
                               PlexorProviderExecQuery};

namespace {

/// After the end of the life the mark is the cleanup's, or a later life's.
void MarkInitialized(int value) {
    const LifeGuard life;
    if (life.Stands()) StoreShared(_ProviderInitialized, value);
}

/// Factory calls on several threads may be here at once.
void WaitDebug() {
    // Nobody who starts a set-user-id process may make it wait.
    const int wait = secure_getenv("WAIT_PROC") != nullptr ? 1 : 0;
    StoreShared(waitDebug, wait);
    if (!wait) {
        syslog(LOG_DEBUG, "Current process:pid=%d, ppid=%d\n", getpid(), getppid());
        return;
    }
    // Only a debugger that attaches ends this.
    do {
        sleep(1);
        syslog(LOG_DEBUG, "Waiting for hostdbgd attach:pid=%d, ppid=%d\n", getpid(), getppid());
    } while (LoadShared(waitDebug));
}

void ReleaseIdentity() {
    const LifeGuard life;
    if (life.Stands()) ReleaseSystemInfo();
}

/// Builds the inventory's controllers and sets the workers going. False when the host has no
/// identity or no RAID vendor, and, silently, when a cleanup has asked for the end meanwhile.
bool BuildInventory(const CMPIInstanceMI* mi, const CMPIContext* ctx) {
    if (StopRequested()) return false;
    Array_t profileArray = {};
    int rc = InitSystemInfo(mi, ctx);
    if (StopRequested()) return false;
    if (rc < 0) {
        syslog(LOG_ERR, "Cannot get system info, rc %d\n", rc);
        return false;
    }
    rc = GetHHRCProfiles(mi, ctx, &profileArray);
    if (StopRequested()) return false;
    if (rc <= 0) {
        syslog(LOG_INFO, "No instance of Host Hard RAID Controller is found, rc %d\n", rc);
        ReleaseIdentity();
        return false;
    }
    BuildControllerInfo(mi, ctx, &profileArray);
    if (StopRequested()) return false;
    InitPlexorThreads(ctx);
    BuildDeviceInfoAsync(mi, ctx);
    return true;
}

/// Takes back what a thread leaves of its initialisation when it is cancelled in it: otherwise the
/// provider would count as initialised for good, or the next attempt find the controllers twice.
class Cancellation {
public:
    Cancellation() = default;
    ~Cancellation() {
        if (impossible_) return;
        const LifeGuard life;
        if (!life.Stands()) return;
        *RaidControllerList = {};
        GiveUpSystemInfo();
        StoreShared(_ProviderInitialized, 0);
    }
    Cancellation(const Cancellation&) = delete;
    Cancellation& operator=(const Cancellation&) = delete;

    void BecomesImpossible() { impossible_ = true; }

private:
    bool impossible_ = false;
};

/// Initialises on a context attached for this thread. Where the broker has none to give, the
/// factory's own context, good for this call, has to do.
void InitializeAttached(const CMPIInstanceMI* mi, const CMPIContext* ctx) {
    const CMPIBroker* broker = CurrentBroker();
    CMPIContext* ctxLocal = broker->bft->prepareAttachThread(broker, ctx);
    if (ctxLocal == nullptr) {
        if (!BuildInventory(mi, ctx)) MarkInitialized(0);
        return;
    }
    broker->bft->attachThread(broker, ctxLocal);
    if (!BuildInventory(mi, ctxLocal)) MarkInitialized(0);
    FlushFactoryContext(ctxLocal);
    broker->bft->detachThread(broker, ctxLocal);
}

void PlexorInit(const CMPIInstanceMI* mi, const CMPIContext* ctx, FactoryCall& call) {
    syslog(LOG_DEBUG, "%s: ENTER...\n", __func__);
    WaitDebug();
    if (!call.TakeTurn()) return;
    MarkInitialized(1);
    Cancellation cancellation;
    InitializeAttached(mi, ctx);
    cancellation.BecomesImpossible();
    syslog(LOG_DEBUG, "%s: EXIT\n", __func__);
}

void PlexorProviderInit(const CMPIInstanceMI* mi, const CMPIContext* ctx, FactoryCall& call) {
    syslog(LOG_DEBUG, "%s\n", __func__);
    syslog(LOG_DEBUG, "PlexorProvider: built on %s\n", __DATE__ " " __TIME__);
    PlexorInit(mi, ctx, call);
}

constexpr CMPIStatus kNotSupported = {CMPI_RC_ERR_NOT_SUPPORTED, nullptr};

}  // namespace

bool IsInitialized() {
    return LoadShared(_ProviderInitialized) != 0;
}

CMPIInstanceMI* PlexorProvider_Create_InstanceMI(const CMPIBroker* brkr, const CMPIContext* ctx,
                                                 CMPIStatus*) {
    static CMPIInstanceMI mi = {nullptr, &instMIFT__};
    FactoryCall call;
    StoreShared(Broker, brkr);
    PlexorProviderInit(&mi, ctx, call);
    StoreShared(InitCompleteTime, time(nullptr));
    return &mi;
}

CMPIStatus PlexorProviderCreateInstance(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                                        const CMPIObjectPath*, const CMPIInstance*) {
    return kNotSupported;
}

CMPIStatus PlexorProviderModifyInstance(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                                        const CMPIObjectPath*, const CMPIInstance*, const char**) {
    return kNotSupported;
}

CMPIStatus PlexorProviderDeleteInstance(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                                        const CMPIObjectPath*) {
    return kNotSupported;
}

CMPIStatus PlexorProviderExecQuery(CMPIInstanceMI*, const CMPIContext*, const CMPIResult*,
                                   const CMPIObjectPath*, const char*, const char*) {
    return kNotSupported;
}
