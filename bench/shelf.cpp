#include "shelf.h"

#include <algorithm>
#include <thread>

#include "bench_clients.h"
#include "drive_shelf.h"
#include "fast_clock.h"
#include "vendor.h"

namespace bench {
namespace {

using torture::FastClock;

constexpr unsigned kNeverSeconds = 1'000'000;
constexpr std::chrono::minutes kInventoryLimit{10};
constexpr int kSpeed = 1000;  // the seconds that an inventory sleeps become milliseconds

void waitForDrives(testbed::ProviderSession& session, const torture::IdleWorkers& workers,
                   int drives) {
    const auto limit = std::chrono::steady_clock::now() + kInventoryLimit;
    while (!workers.areIdle() ||
           session.client().enumerateInstanceNames(kDriveClass).paths.size() !=
               static_cast<std::size_t>(drives)) {
        if (std::chrono::steady_clock::now() > limit)
            throw BenchError("the inventory does not arrive");
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
    }
}

}  // namespace

Shelf::Shelf(int drives, const std::string& library)
    : interval_(kNeverSeconds),
      scenario_(driveShelf(drives, std::chrono::milliseconds(0))),
      cached_(scenario_.controllers.front().drives),
      session_((FastClock::setSpeed(kSpeed), scenario_), library, "PlexorProvider") {
    broker().books().keepCalls(false);
    library_ = std::make_unique<torture::IdleWorkers>(library);
    waitForDrives(session_, *library_, drives);
    FastClock::setSpeed(1);
}

void Shelf::arrange(Results results) {
    if (results == Results::AllNew) {
        generation_++;
        for (std::size_t i = 0; i < cached_.size(); i++)
            cached_[i].id = "g" + std::to_string(generation_) + "." + std::to_string(i);
    }
    auto& drives = scenario_.controllers.front().drives;
    drives = cached_;
    if (results == Results::Reversed) std::reverse(drives.begin(), drives.end());
    if (results == Results::Random) std::shuffle(drives.begin(), drives.end(), random_);
    session_.repository().clearInstances();
    testbed::buildVendor(session_.repository(), scenario_);
}

RaidController_t* Shelf::controller() const {
    const auto* controllers = *library_->symbol<List_t*>("RaidControllerList");
    return static_cast<RaidController_t*>(controllers->Head->Data);
}

void Shelf::refresh() {
    const auto process =
        library_->symbol<decltype(ProcessDeviceConfigChange)>("ProcessDeviceConfigChange");
    FastClock::skip(std::chrono::seconds(kNeverSeconds));
    const testbed::Broker::CallScope scope(broker());
    process(client().mi(), scope.context(), controller(), ACTION_DISK);
}

void Shelf::lookUpMembers() {
    const auto find = library_->symbol<decltype(FindStoragePoolByID)>("FindStoragePoolByID");
    const auto add = library_->symbol<decltype(AddDiskToPool)>("AddDiskToPool");
    RaidController_t* ctrl = controller();
    pthread_mutex_lock(&ctrl->CtrlMutex);
    for (const List_Entry_t* entry = ctrl->DiskList->Head; entry != nullptr; entry = entry->Next) {
        const auto* disk = static_cast<const DiskDrive_t*>(entry->Data);
        add(find(ctrl, disk->Pool), disk->DeviceID);
    }
    pthread_mutex_unlock(&ctrl->CtrlMutex);
}

}  // namespace bench
