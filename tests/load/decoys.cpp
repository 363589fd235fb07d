// Exported by the executable. The dynamic linker offers these to every library first.
#include "decoys.h"

#include <dlfcn.h>

#include <atomic>
#include <cstring>

namespace {

std::atomic<int> calls = 0;
char never[] = "never read";

}  // namespace

#define DECOY_FUNCTION(name) \
    long name() {            \
        ++calls;             \
        return -1;           \
    }

extern "C" {

void* Broker = never;
void* RaidControllerList = never;
char* __SystemName = never;
int _ProviderInitialized = 4711;
unsigned int ActiveThreads = 4711;
unsigned int TerminateThread = 4711;
unsigned int ThreadActivityDone = 4711;
long StateUpdateInterval = 4711;
long NextUnloadTime = 4711;
long InitCompleteTime = 4711;
char __FIFO[256];
char PlexorThreadMutex[64];

DECOY_FUNCTION(FreeList)
DECOY_FUNCTION(PutItem)
DECOY_FUNCTION(GetItem)
DECOY_FUNCTION(IsListEmpty)
DECOY_FUNCTION(IsFifoEmpty)
DECOY_FUNCTION(CMStringCmp)
DECOY_FUNCTION(AddEntryAtListTail)
DECOY_FUNCTION(RemoveEntryFromList)
DECOY_FUNCTION(InitSystemInfo)
DECOY_FUNCTION(ReleaseSystemInfo)
DECOY_FUNCTION(GetSystemName)
DECOY_FUNCTION(GetSystemClassName)
DECOY_FUNCTION(GetHHRCProfiles)
DECOY_FUNCTION(BuildControllerInfo)
DECOY_FUNCTION(BuildDiskInfo)
DECOY_FUNCTION(BuildVolumeInfo)
DECOY_FUNCTION(FreeController)
DECOY_FUNCTION(GetControllerOp)
DECOY_FUNCTION(GetOperationalStatus)
DECOY_FUNCTION(GetSampelInterval)
DECOY_FUNCTION(InitPlexorThreads)
DECOY_FUNCTION(PlexorThread)
DECOY_FUNCTION(BuildDeviceInfoAsync)
DECOY_FUNCTION(DoBuildDeviceInfoAsync)
DECOY_FUNCTION(CleanupPlexorThreads)
DECOY_FUNCTION(HandleDeviceConfigChange)
DECOY_FUNCTION(ResetNextUnloadTime)
DECOY_FUNCTION(PlexorProviderCleanup)
DECOY_FUNCTION(PlexorProviderEnumInstances)

}  // extern "C"

namespace loadtest {

int decoyCalls() {
    return calls;
}

bool decoysAreUntouched() {
    const bool pointers = Broker == never && RaidControllerList == never && __SystemName == never &&
                          std::strcmp(never, "never read") == 0;
    const bool words = _ProviderInitialized == 4711 && ActiveThreads == 4711 &&
                       TerminateThread == 4711 && ThreadActivityDone == 4711 &&
                       StateUpdateInterval == 4711 && NextUnloadTime == 4711 &&
                       InitCompleteTime == 4711;
    const char zeros[256] = {};
    const bool blocks = std::memcmp(__FIFO, zeros, sizeof __FIFO) == 0 &&
                        std::memcmp(PlexorThreadMutex, zeros, sizeof PlexorThreadMutex) == 0;
    return pointers && words && blocks;
}

bool decoysAreExported() {
    return dlsym(RTLD_DEFAULT, "Broker") == &Broker &&
           dlsym(RTLD_DEFAULT, "FreeList") == reinterpret_cast<void*>(&FreeList);
}

}  // namespace loadtest
