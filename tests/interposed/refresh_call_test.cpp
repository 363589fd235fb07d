// What a request hands to the refresh of a device class.
#include <pthread.h>

#include <vector>

#include "serve_fixture.h"

namespace {

struct RefreshCall {
    const CMPIInstanceMI* mi;
    const CMPIContext* ctx;
    const RaidController_t* ctrl;
    int action;
    bool ctrlMutexFree;

    bool operator==(const RefreshCall&) const = default;
};

std::vector<RefreshCall> refreshCalls;

}  // namespace

/// Notes the call and refreshes nothing; its result must not matter to the request.
extern "C" int __wrap_HandleDeviceConfigChange(const CMPIInstanceMI* mi, const CMPIContext* ctx,
                                               RaidController_t* ctrl, int action) {
    const bool isFree = pthread_mutex_trylock(&ctrl->CtrlMutex) == 0;
    if (isFree) pthread_mutex_unlock(&ctrl->CtrlMutex);
    refreshCalls.push_back({mi, ctx, ctrl, action, isFree});
    return RESULT_FIFO_FULL;
}

namespace plexortest {
namespace {

class ServeRefreshCall : public ServeTest {
protected:
    void SetUp() override {
        ServeTest::SetUp();
        for (const char* id : {"C0", "C1"}) {
            controllers.push_back(attach(newController(id)));
            for (const DeviceClass& device : kDeviceClasses) device.cache(controllers.back(), "d1");
        }
        result = broker.makeResult(collected);
        refreshCalls.clear();
    }
    RefreshCall call(size_t controller, int action) {
        return {&requestMi, ctx(), controllers[controller], action, true};
    }

    /// An interface object that only requests know.
    CMPIInstanceMI requestMi = {nullptr, &instMIFT__};
    std::vector<RaidController_t*> controllers;
    testbed::Broker::Collected collected;
    CMPIResult* result = nullptr;
};

TEST_F(ServeRefreshCall, EnumerationsHandOnEveryControllerWithTheRequestsInterfaceAndContext) {
    for (const DeviceClass& device : kDeviceClasses) {
        const CMPIObjectPath* path = broker.makePath({"root/cimv2", device.name, {}});
        const std::vector<RefreshCall> expected = {call(0, device.action), call(1, device.action)};
        refreshCalls.clear();
        EXPECT_EQ(CMPI_RC_OK, PlexorProviderEnumInstanceNames(&requestMi, ctx(), result, path).rc);
        EXPECT_EQ(expected, refreshCalls);
        refreshCalls.clear();
        EXPECT_EQ(CMPI_RC_OK,
                  PlexorProviderEnumInstances(&requestMi, ctx(), result, path, nullptr).rc);
        EXPECT_EQ(expected, refreshCalls);
    }
}

TEST_F(ServeRefreshCall, AGetHandsOnTheMatchingControllerFoundOrNot) {
    for (const DeviceClass& device : kDeviceClasses) {
        const std::vector<RefreshCall> expected = {call(1, device.action)};
        for (const char* deviceId : {"d1", "d9"}) {
            const CMPIObjectPath* path = broker.makePath(devicePath(device, "C1", deviceId));
            refreshCalls.clear();
            PlexorProviderGetInstance(&requestMi, ctx(), result, path, nullptr);
            EXPECT_EQ(expected, refreshCalls);
        }
    }
}

TEST_F(ServeRefreshCall, ControllersAndSoftwareIdentitiesAreNotHandedOn) {
    for (const testbed::ObjectPath& known : {controllerPath("C0"), softwarePath("C0")}) {
        const CMPIObjectPath* path = broker.makePath(known);
        PlexorProviderEnumInstanceNames(&requestMi, ctx(), result, path);
        PlexorProviderEnumInstances(&requestMi, ctx(), result, path, nullptr);
        PlexorProviderGetInstance(&requestMi, ctx(), result, path, nullptr);
    }
    EXPECT_TRUE(refreshCalls.empty());
}

}  // namespace
}  // namespace plexortest
