// Which lock a request holds when.
#include <pthread.h>

#include <chrono>
#include <future>
#include <map>
#include <set>
#include <string>

#include "serve_fixture.h"
#include "vendor_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;
using testbed::Response;

/// What a request does for one record, step by step.
constexpr Entry kNameSteps[] = {Entry::NewObjectPath, Entry::PathAddKey,
                                Entry::ResultReturnObjectPath};
constexpr Entry kInstanceSteps[] = {Entry::NewObjectPath,       Entry::PathAddKey,
                                    Entry::NewInstance,         Entry::InstanceSetPropertyFilter,
                                    Entry::InstanceSetProperty, Entry::NewArray,
                                    Entry::ArraySetElementAt,   Entry::ResultReturnInstance};

class ServeLocks : public ServeTest {
protected:
    void SetUp() override {
        ServeTest::SetUp();
        for (const char* id : {"C0", "C1"}) {
            RaidController_t* ctrl = attach(newController(id));
            controllers.push_back(ctrl);
            for (const DeviceClass& device : kDeviceClasses) device.cache(ctrl, "d1");
        }
    }
    /// The identifiers of the controllers whose CtrlMutex is held now.
    std::string held() {
        std::string ids;
        for (RaidController_t* ctrl : controllers) {
            if (!isFree(ctrl->CtrlMutex)) ids += ctrl->DeviceID + std::string(" ");
        }
        return ids;
    }
    /// Notes in seen[entry] which mutexes are held at each call of the entry.
    void watch(Entry entry) {
        FaultRule rule;
        rule.entry = entry;
        rule.hook = [this, entry] { seen[entry].insert(held()); };
        faults().add(rule);
    }
    template <size_t Count>
    void watchAll(const Entry (&entries)[Count]) {
        for (const Entry entry : entries) watch(entry);
        watch(Entry::ResultReturnDone);
    }
    template <size_t Count>
    void expectAtEach(const Entry (&entries)[Count], const std::set<std::string>& heldThere) {
        for (const Entry entry : entries) {
            EXPECT_EQ(heldThere, seen[entry]) << testbed::entryName(entry);
        }
        EXPECT_EQ(std::set<std::string>{""}, seen[Entry::ResultReturnDone]);
        seen.clear();
    }

    std::vector<RaidController_t*> controllers;
    std::map<Entry, std::set<std::string>> seen;
    const testbed::PropertyList list = {{"ElementName", "OperationalStatus"}};
};

TEST_F(ServeLocks, NamingDevicesHoldsTheirControllersMutexOnly) {
    watchAll(kNameSteps);
    for (const DeviceClass& device : kDeviceClasses) {
        EXPECT_EQ(2u, client().enumerateInstanceNames(device.name).paths.size());
        expectAtEach(kNameSteps, {"C0 ", "C1 "});
        EXPECT_EQ("", held());
    }
}

TEST_F(ServeLocks, RenderingDevicesHoldsTheirControllersMutexOnly) {
    watchAll(kInstanceSteps);
    for (const DeviceClass& device : kDeviceClasses) {
        EXPECT_EQ(2u, client().enumerateInstances(device.name, list).instances.size());
        expectAtEach(kInstanceSteps, {"C0 ", "C1 "});
        EXPECT_EQ("", held());
    }
}

TEST_F(ServeLocks, GettingADeviceHoldsItsControllersMutexOnly) {
    watchAll(kInstanceSteps);
    for (const DeviceClass& device : kDeviceClasses) {
        EXPECT_EQ(1u, client().getInstance(devicePath(device, "C1", "d1"), list).instances.size());
        expectAtEach(kInstanceSteps, {"C1 "});
        EXPECT_EQ("", held());
    }
}

TEST_F(ServeLocks, ControllersAreServedWithoutLock) {
    watchAll(kNameSteps);
    for (const char* className : {kController, kSoftwareIdentity}) {
        EXPECT_EQ(2u, client().enumerateInstanceNames(className).paths.size());
        expectAtEach(kNameSteps, {""});
    }
    faults().clear();
    watchAll(kInstanceSteps);
    EXPECT_EQ(2u, client().enumerateInstances(kController, list).instances.size());
    expectAtEach(kInstanceSteps, {""});
    EXPECT_EQ(1u, client().getInstance(controllerPath("C1"), list).instances.size());
    expectAtEach(kInstanceSteps, {""});
}

TEST_F(ServeLocks, SoftwareIdentitiesAreRenderedWithoutLock) {
    constexpr Entry steps[] = {Entry::NewInstance, Entry::InstanceSetProperty,
                               Entry::ResultReturnInstance};
    watchAll(steps);
    client().enumerateInstances(kSoftwareIdentity);
    expectAtEach(steps, {""});
    client().getInstance(softwarePath("C0"));
    expectAtEach(steps, {""});
}

TEST_F(ServeLocks, ARefreshIsAskedForWithoutLockAfterTheControllersDevices) {
    std::vector<std::string> events;
    CapturedSyslog::onLine([&](const LogLine& line) {
        if (line.text.starts_with("HandleDeviceConfigChange: ENTER. ")) {
            events.push_back("refresh, held: " + held());
        }
    });
    FaultRule rule;
    for (const Entry entry : {Entry::ResultReturnInstance, Entry::ResultReturnObjectPath}) {
        rule.entry = entry;
        rule.hook = [&] { events.push_back("return, held: " + held()); };
        faults().add(rule);
    }
    const std::vector<std::string> each = {
        "return, held: C0 ", "refresh, held: ", "return, held: C1 ", "refresh, held: "};
    for (const DeviceClass& device : kDeviceClasses) {
        events.clear();
        client().enumerateInstanceNames(device.name);
        EXPECT_EQ(each, events);
        events.clear();
        client().enumerateInstances(device.name);
        EXPECT_EQ(each, events);
        events.clear();
        client().getInstance(devicePath(device, "C0", "d1"));
        EXPECT_EQ(std::vector<std::string>(each.begin(), each.begin() + 2), events);
    }
}

/// Whether the request ends although the test holds that mutex.
template <class Ask>
bool endsWhileHeld(pthread_mutex_t& mutex, Ask ask) {
    pthread_mutex_lock(&mutex);
    auto answer = std::async(std::launch::async, ask);
    const bool ended = answer.wait_for(kGenerousLimit) == std::future_status::ready;
    pthread_mutex_unlock(&mutex);
    EXPECT_EQ(CMPI_RC_OK, answer.get().rc);
    return ended;
}

TEST_F(ServeLocks, AGetNeverTouchesTheMutexOfAnotherController) {
    for (const DeviceClass& device : kDeviceClasses) {
        EXPECT_TRUE(endsWhileHeld(controllers[1]->CtrlMutex, [&] {
            return client().getInstance(devicePath(device, "C0", "d1"));
        }));
    }
}

TEST_F(ServeLocks, ControllersAreServedWhileTheirMutexIsHeldElsewhere) {
    for (const char* className : {kController, kSoftwareIdentity}) {
        EXPECT_TRUE(endsWhileHeld(controllers[0]->CtrlMutex,
                                  [&] { return client().enumerateInstances(className); }));
        EXPECT_TRUE(endsWhileHeld(controllers[0]->CtrlMutex,
                                  [&] { return client().enumerateInstanceNames(className); }));
    }
    EXPECT_TRUE(endsWhileHeld(controllers[0]->CtrlMutex,
                              [&] { return client().getInstance(controllerPath("C0")); }));
    EXPECT_TRUE(endsWhileHeld(controllers[0]->CtrlMutex,
                              [&] { return client().getInstance(softwarePath("C0")); }));
}

TEST_F(ServeLocks, NoClassMutexIsNeeded) {
    RaidController_t* ctrl = controllers[0];
    for (pthread_mutex_t* mutex :
         {&ctrl->DiskCfgMutex, &ctrl->VolumeCfgMutex, &ctrl->PortCfgMutex, &ctrl->BatteryCfgMutex,
          &ctrl->PoolCfgMutex, &ctrl->ChassisCfgMutex}) {
        EXPECT_TRUE(endsWhileHeld(*mutex, [&] {
            Response response;
            for (const DeviceClass& device : kDeviceClasses) {
                response = client().enumerateInstances(device.name);
            }
            return response;
        }));
    }
}

TEST_F(ServeLocks, RequestsOnSeveralThreadsAreAllAnswered) {
    std::vector<std::future<size_t>> answers;
    for (int thread = 0; thread < 4; thread++) {
        answers.push_back(std::async(std::launch::async, [this] {
            size_t found = 0;
            for (int round = 0; round < 10; round++) {
                for (const std::string& className : servedClasses()) {
                    found += client().enumerateInstanceNames(className).paths.size();
                    found += client().enumerateInstances(className).instances.size();
                }
                for (const DeviceClass& device : kDeviceClasses) {
                    found += client().getInstance(devicePath(device, "C1", "d1")).instances.size();
                }
            }
            return found;
        }));
    }
    // Two controllers: 2 x 2 x 6 answers of the enumerations, 4 of the gets, ten times.
    for (auto& answer : answers) EXPECT_EQ(280u, answer.get());
}

}  // namespace
}  // namespace plexortest
