// The factory, the function table and the one-time initialisation.
#include <stdlib.h>
#include <unistd.h>

#include "PlexorProviderCfg.h"
#include "PlexorProviderIfc.h"
#include "PlexorProviderLock.h"

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

/// One initialisation at a time. A manager calls the factory once for each class it serves, on
/// several threads; a later call returns when the first has built the inventory, not before.
pthread_mutex_t __InitMutex = PTHREAD_ERRORCHECK_MUTEX_INITIALIZER_NP;
int __Initializing = 0;  // 1 while the controllers are looked for; atomic

constexpr time_t kTurnLimitSeconds = 30;

/// The right to initialise, for a scope. A vendor that is asked for its controllers may itself ask
/// the manager for computer systems, and so have the factory called before it answers: on the same
/// thread such a call gets no turn, on another one none after a time limit.
class InitTurn {
public:
    InitTurn() {
        timespec deadline;
        clock_gettime(CLOCK_REALTIME, &deadline);
        deadline.tv_sec += kTurnLimitSeconds;
        taken_ = pthread_mutex_timedlock(&__InitMutex, &deadline) == 0;
    }
    ~InitTurn() {
        if (taken_) pthread_mutex_unlock(&__InitMutex);
    }
    InitTurn(const InitTurn&) = delete;
    InitTurn& operator=(const InitTurn&) = delete;

    bool Taken() const { return taken_; }

private:
    bool taken_;
};

void SetInitialized(int value) {
    __atomic_store_n(&_ProviderInitialized, value, __ATOMIC_RELAXED);
}

/// Factory calls on several threads may be here at once.
void WaitDebug() {
    const int wait = getenv("WAIT_PROC") != nullptr ? 1 : 0;
    __atomic_store_n(&waitDebug, wait, __ATOMIC_RELAXED);
    if (!wait) {
        syslog(LOG_DEBUG, "Current process:pid=%d, ppid=%d\n", getpid(), getppid());
        return;
    }
    // Only a debugger that attaches ends this.
    do {
        sleep(1);
        syslog(LOG_DEBUG, "Waiting for hostdbgd attach:pid=%d, ppid=%d\n", getpid(), getppid());
    } while (__atomic_load_n(&waitDebug, __ATOMIC_RELAXED));
}

/// Builds the inventory's controllers and sets the workers going. False when the host has no
/// identity or no RAID vendor.
bool BuildInventory(const CMPIInstanceMI* mi, const CMPIContext* ctx) {
    Array_t profileArray = {};
    AdmitWork();
    int rc = InitSystemInfo(mi, ctx);
    if (rc < 0) {
        syslog(LOG_ERR, "Cannot get system info, rc %d\n", rc);
        return false;
    }
    rc = GetHHRCProfiles(mi, ctx, &profileArray);
    if (rc <= 0) {
        syslog(LOG_INFO, "No instance of Host Hard RAID Controller is found, rc %d\n", rc);
        ReleaseSystemInfo();
        return false;
    }
    BuildControllerInfo(mi, ctx, &profileArray);
    InitPlexorThreads(ctx);
    BuildDeviceInfoAsync(mi, ctx);
    return true;
}

/// Initialises on a context attached for this thread. Where the broker has none to give, the
/// factory's own context, good for this call, has to do.
void InitializeAttached(const CMPIInstanceMI* mi, const CMPIContext* ctx) {
    const CMPIBroker* broker = CurrentBroker();
    CMPIContext* ctxLocal = broker->bft->prepareAttachThread(broker, ctx);
    if (ctxLocal == nullptr) {
        if (!BuildInventory(mi, ctx)) SetInitialized(0);
        return;
    }
    broker->bft->attachThread(broker, ctxLocal);
    if (!BuildInventory(mi, ctxLocal)) SetInitialized(0);
    FlushContext(ctxLocal);
    broker->bft->detachThread(broker, ctxLocal);
}

void PlexorInit(const CMPIInstanceMI* mi, const CMPIContext* ctx) {
    syslog(LOG_DEBUG, "%s: ENTER...\n", __func__);
    WaitDebug();
    const InitTurn turn;
    if (!turn.Taken() || __atomic_load_n(&_ProviderInitialized, __ATOMIC_RELAXED)) return;
    SetInitialized(1);
    __atomic_store_n(&__Initializing, 1, __ATOMIC_RELEASE);
    InitializeAttached(mi, ctx);
    __atomic_store_n(&__Initializing, 0, __ATOMIC_RELEASE);
    syslog(LOG_DEBUG, "%s: EXIT\n", __func__);
}

void PlexorProviderInit(const CMPIInstanceMI* mi, const CMPIContext* ctx) {
    syslog(LOG_DEBUG, "%s\n", __func__);
    syslog(LOG_DEBUG, "PlexorProvider: built on %s\n", __DATE__ " " __TIME__);
    PlexorInit(mi, ctx);
}

constexpr CMPIStatus kNotSupported = {CMPI_RC_ERR_NOT_SUPPORTED, nullptr};

}  // namespace

const List_Entry_t* FirstController() {
    if (__atomic_load_n(&__Initializing, __ATOMIC_ACQUIRE)) return nullptr;
    return RaidControllerList->Head;
}

CMPIInstanceMI* PlexorProvider_Create_InstanceMI(const CMPIBroker* brkr, const CMPIContext* ctx,
                                                 CMPIStatus*) {
    static CMPIInstanceMI mi = {nullptr, &instMIFT__};
    __atomic_store_n(&Broker, brkr, __ATOMIC_RELAXED);
    PlexorProviderInit(&mi, ctx);
    StoreTime(InitCompleteTime, time(nullptr));
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
