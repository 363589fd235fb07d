// The refreshes that requests cause: gated by the initial inventory and the interval, queued for
// the workers, never part of the answer.
#include <string>

#include "PlexorProviderLock.h"
#include "serve_fixture.h"

namespace plexortest {
namespace {

using testbed::Response;

class ServeRefresh : public ServeTest {
protected:
    void SetUp() override {
        ServeTest::SetUp();
        ctrl = attach(newController("C0"));
        for (const DeviceClass& device : kDeviceClasses) device.cache(ctrl, "d1");
        MutexGuard lock(PlexorThreadMutex);
        ThreadActivityDone = 1;
    }
    /// Takes the oldest item from the queue and checks that it refreshes that class.
    void expectQueued(RaidController_t* wanted, int action) {
        auto* item = static_cast<Thread_Args_t*>(GetItem(&__FIFO));
        ASSERT_NE(nullptr, item);
        EXPECT_EQ(DoDeviceConfigChange, item->Func);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(&mi), item->Arg0);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(wanted), item->Arg2);
        EXPECT_EQ(static_cast<uintptr_t>(action), item->Arg3);
        free(item);
    }
    void refreshedNow() {
        const time_t now = VirtualClock::now();
        for (time_t* time : {&ctrl->DiskUpdateTime, &ctrl->VolumeUpdateTime, &ctrl->PortUpdateTime,
                             &ctrl->BatteryUpdateTime}) {
            *time = now;
        }
    }

    RaidController_t* ctrl = nullptr;
};

TEST_F(ServeRefresh, EachOperationQueuesOneWithTheRequestsInterface) {
    for (const DeviceClass& device : kDeviceClasses) {
        for (const Operation& operation : allOperations()) {
            const Response response = operation.ask(client(), devicePath(device, "C0", "d1"));
            EXPECT_EQ(CMPI_RC_OK, response.rc);
            expectQueued(ctrl, device.action);
            EXPECT_TRUE(IsFifoEmpty(&__FIFO));
        }
    }
}

TEST_F(ServeRefresh, OneForEachControllerThatIsEnumerated) {
    RaidController_t* second = attach(newController("C1"));
    for (const DeviceClass& device : kDeviceClasses) {
        for (const Operation& operation : enumerations()) {
            operation.ask(client(), devicePath(device, "", ""));
            expectQueued(ctrl, device.action);
            expectQueued(second, device.action);
            EXPECT_TRUE(IsFifoEmpty(&__FIFO));
        }
    }
}

TEST_F(ServeRefresh, ControllersAndSoftwareIdentitiesQueueNone) {
    for (const Operation& operation : allOperations()) {
        operation.ask(client(), controllerPath("C0"));
        operation.ask(client(), softwarePath("C0"));
    }
    EXPECT_TRUE(IsFifoEmpty(&__FIFO));
    EXPECT_TRUE(refreshRequests().empty());
}

TEST_F(ServeRefresh, NotBeforeTheIntervalHasPassed) {
    refreshedNow();
    VirtualClock::advance(19);
    for (const DeviceClass& device : kDeviceClasses) client().enumerateInstances(device.name);
    EXPECT_TRUE(IsFifoEmpty(&__FIFO));
    EXPECT_EQ(4u, refreshRequests().size());
    VirtualClock::advance(1);
    for (const DeviceClass& device : kDeviceClasses) {
        client().enumerateInstances(device.name);
        expectQueued(ctrl, device.action);
    }
}

TEST_F(ServeRefresh, NotBeforeTheInitialInventoryIsDone) {
    {
        MutexGuard lock(PlexorThreadMutex);
        ThreadActivityDone = 0;
    }
    for (const DeviceClass& device : kDeviceClasses) {
        EXPECT_EQ(1u, client().enumerateInstances(device.name).instances.size());
    }
    EXPECT_TRUE(IsFifoEmpty(&__FIFO));
    EXPECT_EQ(4u, refreshRequests().size());
}

TEST_F(ServeRefresh, AFullQueueChangesNothingForTheClient) {
    for (int i = 0; i < 20; i++) client().enumerateInstances("Tovexa_PlexorBattery");
    EXPECT_EQ(20u, __FIFO.List.Size);
    const Response response = client().enumerateInstances("Tovexa_PlexorBattery");
    EXPECT_EQ(CMPI_RC_OK, response.rc);
    EXPECT_EQ(1u, response.instances.size());
    EXPECT_EQ(1, response.doneCalls);
    EXPECT_EQ(20u, __FIFO.List.Size);
}

TEST_F(ServeRefresh, IsNotWaitedFor) {
    // Nobody works on the queue, and nobody sleeps.
    for (const DeviceClass& device : kDeviceClasses) client().enumerateInstances(device.name);
    EXPECT_TRUE(VirtualClock::sleeps().empty());
    EXPECT_TRUE(books().queries().empty());
}

}  // namespace
}  // namespace plexortest
