// One cached controller "C0" whose pools and enclosures are to be gathered.
#pragma once

#include "device_fixture.h"

namespace plexortest {

class EnclosureTest : public DeviceTest {
protected:
    void SetUp() override {
        DeviceTest::SetUp();
        ctrl->ControllerOp = clonedPath(card.system);
        startOver();
    }
    std::vector<StoragePool_t*> pools() const { return recordsOf<StoragePool_t>(ctrl->PoolList); }
    std::vector<Chassis_t*> chassis() const { return recordsOf<Chassis_t>(ctrl->ChassisList); }
    /// Releases the cached pools and chassis.
    void forgetAll() {
        FreeList(ctrl->PoolList, FreePool);
        FreeList(ctrl->ChassisList, FreeChassis);
        startOver();
    }
    int buildPool(const Path& path) {
        return BuildSinglePoolInfo(&mi, ctx(), ctrl, instanceAt(path), broker.makePath(path));
    }
    int buildChassis(const Path& path) {
        return BuildSingleChassisInfo(&mi, ctx(), ctrl, instanceAt(path), broker.makePath(path));
    }
    static std::string textOf(const char* text) { return text != nullptr ? text : "absent"; }
};

/// Holds a mutex on a thread of its own until a line that contains `part` has been logged, then
/// runs `check` and lets go.
class HolderUntilLogged {
public:
    HolderUntilLogged(pthread_mutex_t& mutex, std::string part, std::function<void()> check)
        : thread_([this, &mutex, part = std::move(part), check = std::move(check)] {
              pthread_mutex_lock(&mutex);
              held_ = true;
              eventually([&part] { return CapturedSyslog::countContaining(part) != 0; });
              // Time enough for somebody who does not wait for the mutex.
              std::this_thread::sleep_for(std::chrono::milliseconds(5));
              check();
              pthread_mutex_unlock(&mutex);
          }) {
        while (!held_) std::this_thread::yield();
    }
    ~HolderUntilLogged() { thread_.join(); }

private:
    std::atomic<bool> held_ = false;
    std::thread thread_;
};

}  // namespace plexortest
