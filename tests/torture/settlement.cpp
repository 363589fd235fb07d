#include "settlement.h"

#include <chrono>
#include <thread>

#include "PlexorProviderCfg.h"
#include "PlexorProviderLock.h"
#include "inventory.h"

namespace torture {
namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds kLimit{60};
constexpr std::chrono::milliseconds kPause{20};

bool workersIdle() {
    MutexGuard lock(PlexorThreadMutex);
    return IsFifoEmpty(&__FIFO) && ActiveThreads == 0;
}

bool refreshedSince(const RaidController_t& ctrl, time_t mark) {
    return LoadShared(ctrl.PoolUpdateTime) > mark && LoadShared(ctrl.DiskUpdateTime) > mark &&
           LoadShared(ctrl.VolumeUpdateTime) > mark && LoadShared(ctrl.PortUpdateTime) > mark &&
           LoadShared(ctrl.BatteryUpdateTime) > mark;
}

bool allRefreshedSince(time_t mark) {
    const List_Entry_t* entry = RaidControllerList->Head;
    for (; entry != nullptr; entry = entry->Next)
        if (!refreshedSince(*static_cast<const RaidController_t*>(entry->Data), mark)) return false;
    return true;
}

template <typename Condition>
bool waitFor(Clock::time_point deadline, Condition condition) {
    while (!condition()) {
        if (Clock::now() >= deadline) return false;
        std::this_thread::sleep_for(kPause);
    }
    return true;
}

/// One refresh of everything that begins after the call.
bool refreshAll(testbed::InstanceClient& client, Clock::time_point deadline) {
    if (!waitFor(deadline, workersIdle)) return false;
    const time_t mark = time(nullptr);
    const bool refreshed = waitFor(deadline, [&] {
        for (const auto& served : testbed::servedClasses())
            client.enumerateInstanceNames(served.name);
        return allRefreshedSince(mark);
    });
    return refreshed && waitFor(deadline, workersIdle);
}

}  // namespace

bool settle(testbed::InstanceClient& client) {
    const auto deadline = Clock::now() + kLimit;
    // Twice: a drive may be refreshed before the pool that it has moved to is cached.
    return refreshAll(client, deadline) && refreshAll(client, deadline);
}

}  // namespace torture
