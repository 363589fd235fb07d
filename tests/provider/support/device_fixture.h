// What the tests of the device builders and updaters share: a controller, a vendor, and ways to
// build from the vendor's objects, to see what was asked, and to hold the controller's lock.
#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <functional>
#include <optional>
#include <string>
#include <thread>
#include <vector>

#include "log_text.h"
#include "provider_fixture.h"
#include "query_arguments.h"
#include "vendor_objects.h"

namespace plexortest {

class DeviceTest : public ProviderTest {
protected:
    using Path = testbed::ObjectPath;
    using Texts = std::vector<std::string>;

    DeviceTest() : vendor(repository) {}

    void SetUp() override {
        ProviderTest::SetUp();
        card = vendor.controller("C0");
        ctrl = attach(newController("C0"));
    }

    CMPIInstance* instanceAt(const Path& path) {
        return broker.makeInstance(repository.get(path).value());
    }
    /// Builds from the vendor's object as it is now.
    int build(BuildFunc_t builder, const Path& path) {
        return builder(&mi, ctx(), ctrl, instanceAt(path), broker.makePath(path));
    }
    int update(UpdateFunc_t updater, void* device, CMPIInstance* fresh) {
        return updater(&mi, ctx(), ctrl, device, fresh);
    }

    static Texts members(const StoragePool_t* pool) {
        Texts ids;
        for (const List_Entry_t* entry = pool->Drives->Head; entry != nullptr; entry = entry->Next)
            ids.emplace_back(static_cast<const char*>(entry->Data));
        return ids;
    }

    /// Forgets the log and the calls so far.
    void startOver() {
        CapturedSyslog::clear();
        books().clearCalls();
    }

    /// Every call that the broker was asked for: "Associators <path> <assoc>/<result>".
    Texts brokerCalls() {
        Texts calls;
        for (const testbed::CallRecord& call : books().calls()) {
            if (testbed::isObjectEntry(call.entry)) continue;
            std::string text = std::string(testbed::entryName(call.entry)) + " " + call.path;
            if (call.entry != testbed::Entry::GetInstance)
                text += " " + call.assocClass.value_or("NULL") + "/" +
                        call.resultClass.value_or("NULL");
            calls.push_back(text + (asksForAll(call) ? "" : " with roles or properties"));
        }
        return calls;
    }

    /// Names of the properties read from instances of the class, in order; needs recordObjectCalls.
    Texts propertiesRead(const std::string& className) {
        Texts names;
        for (const testbed::CallRecord& call : books().calls())
            if (call.entry == testbed::Entry::InstanceGetProperty && call.className == className)
                names.push_back(call.name.value_or(""));
        return names;
    }

    /// Fails the query; a message of nullopt means a status without one.
    void failQuery(testbed::Entry entry, const std::string& assocClass, CMPIrc rc,
                   const std::optional<std::string>& message) {
        testbed::FaultRule rule = queryRule(entry, assocClass);
        rule.rc = rc;
        rule.message = message;
        faults().add(rule);
    }
    /// Answers status OK and NULL.
    void answerNull(testbed::Entry entry, const std::string& assocClass) {
        testbed::FaultRule rule = queryRule(entry, assocClass);
        rule.nullResult = true;
        faults().add(rule);
    }
    static testbed::FaultRule queryRule(testbed::Entry entry, const std::string& assocClass) {
        testbed::FaultRule rule;
        rule.entry = entry;
        if (!assocClass.empty()) rule.assocClass = assocClass;
        return rule;
    }

    /// Runs `hook` at every call of that entry, on the calling thread, before the answer.
    void whenCalled(testbed::Entry entry, std::function<void()> hook,
                    const std::string& assocClass = "") {
        testbed::FaultRule rule = queryRule(entry, assocClass);
        rule.hook = std::move(hook);
        faults().add(rule);
    }
    /// The n-th clone from now (0 is the next) answers NULL.
    void failClone(int n) {
        testbed::FaultRule rule;
        rule.entry = testbed::Entry::Clone;
        rule.skip = n;
        rule.times = 1;
        faults().add(rule);
    }

    /// From now on counts in `heldCalls_` what is asked of the broker and read from its instances
    /// while CtrlMutex is held.
    void watchLock() {
        for (testbed::Entry entry :
             {testbed::Entry::Associators, testbed::Entry::AssociatorNames,
              testbed::Entry::GetInstance, testbed::Entry::InstanceGetProperty})
            whenCalled(entry, [this] {
                watchedCalls_++;
                if (!lockIsFree()) heldCalls_++;
            });
    }
    std::atomic<int> watchedCalls_ = 0;
    std::atomic<int> heldCalls_ = 0;

    /// Keeps every line with a mark of whether CtrlMutex was held: "held DEBUG …", "free DEBUG …".
    void watchLog() {
        CapturedSyslog::onLine([this](const LogLine& line) {
            linesWithLock_.push_back({lockIsFree() ? "free " : "held ", line});
        });
    }
    Texts logWithLock(const AddressNames& names = {}) const {
        Texts lines;
        for (const auto& [mark, line] : linesWithLock_)
            lines.push_back(mark + logText(line, names));
        return lines;
    }
    /// Whether nobody, this thread included, holds CtrlMutex.
    bool lockIsFree() {
        if (pthread_mutex_trylock(&ctrl->CtrlMutex) != 0) return false;
        pthread_mutex_unlock(&ctrl->CtrlMutex);
        return true;
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

    VendorObjects vendor;
    VendorController card;
    RaidController_t* ctrl = nullptr;

private:
    std::vector<std::pair<std::string, LogLine>> linesWithLock_;
};

/// The record at the head of a list.
template <class Record>
Record* firstOf(const List_t* list) {
    return list->Head != nullptr ? static_cast<Record*>(list->Head->Data) : nullptr;
}

}  // namespace plexortest
