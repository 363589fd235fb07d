// What the tests of one controller's walks, builders and updaters share: the cached controller, and
// ways to build from the vendor's objects, and to hold the controller's lock.
#pragma once

#include <atomic>
#include <chrono>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "vendor_fixture.h"

namespace plexortest {

/// What a typed test over kinds of device is called for each of them.
struct KindNames {
    template <class Kind>
    static std::string GetName(int) {
        return Kind::name;
    }
};

class DeviceTest : public VendorTest {
protected:
    /// When the tests of updates go on, the build being forgotten.
    static constexpr time_t kLater = kStart + 30;

    void SetUp() override {
        VendorTest::SetUp();
        card = vendor.controller("C0");
        ctrl = attach(newController("C0"));
    }

    /// Builds from the vendor's object as it is now.
    int build(BuildFunc_t builder, const Path& path) {
        return builder(&mi, ctx(), ctrl, instanceAt(path), broker.makePath(path));
    }
    int update(UpdateFunc_t updater, void* device, CMPIInstance* fresh) {
        return updater(&mi, ctx(), ctrl, device, fresh);
    }

    /// Lets some time go by after a build, and forgets its log and calls.
    void goOnLater() {
        VirtualClock::set(kLater);
        startOver();
    }

    static Texts members(const StoragePool_t* pool) {
        Texts ids;
        for (const List_Entry_t* entry = pool->Drives->Head; entry != nullptr; entry = entry->Next)
            ids.emplace_back(static_cast<const char*>(entry->Data));
        return ids;
    }

    /// From now on counts in `heldCalls_` what is asked of the broker and read from its instances
    /// while CtrlMutex is held.
    void watchLock() {
        for (testbed::Entry entry :
             {testbed::Entry::Associators, testbed::Entry::AssociatorNames,
              testbed::Entry::GetInstance, testbed::Entry::InstanceGetProperty})
            faults().add(watch(entry, [this] {
                watchedCalls_++;
                if (!isFree(ctrl->CtrlMutex)) heldCalls_++;
            }));
    }
    std::atomic<int> watchedCalls_ = 0;
    std::atomic<int> heldCalls_ = 0;

    /// Keeps every line with a mark of whether CtrlMutex was held: "held DEBUG …", "free DEBUG …".
    void watchLog() {
        CapturedSyslog::onLine([this](const LogLine& line) {
            linesWithLock_.push_back({isFree(ctrl->CtrlMutex) ? "free " : "held ", line});
        });
    }
    Texts logWithLock(const AddressNames& names = {}) const {
        Texts lines;
        for (const auto& [mark, line] : linesWithLock_)
            lines.push_back(mark + logText(line, names));
        return lines;
    }

    /// Runs `work` on a thread of its own while this thread holds CtrlMutex. `meanwhile` is called
    /// with the lock held once `reached` is true and the thread had time to go too far.
    void whileLockIsTaken(const std::function<void(const CMPIContext*)>& work,
                          const std::function<bool()>& reached,
                          const std::function<void()>& meanwhile) {
        pthread_mutex_lock(&ctrl->CtrlMutex);
        std::thread worker([&] {
            testbed::Broker::CallScope scope(broker);
            work(scope.context());
        });
        EXPECT_TRUE(eventually(reached)) << "the thread waits for the lock too early";
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
        meanwhile();
        pthread_mutex_unlock(&ctrl->CtrlMutex);
        worker.join();
    }

    /// Updates while the lock is taken, which the update needs once it has made that many queries.
    void updateWhileLockIsTaken(UpdateFunc_t updater, void* device, CMPIInstance* fresh,
                                std::size_t queries, const std::function<void()>& meanwhile) {
        whileLockIsTaken(
            [&](const CMPIContext* context) {
                EXPECT_EQ(updater(&mi, context, ctrl, device, fresh), 0);
            },
            [&] { return books().queries().size() == queries; }, meanwhile);
    }

    VendorController card;
    RaidController_t* ctrl = nullptr;

private:
    std::vector<std::pair<std::string, LogLine>> linesWithLock_;
};

}  // namespace plexortest
