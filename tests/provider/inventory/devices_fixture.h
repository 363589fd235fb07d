// One cached controller "C0" whose logical devices are to be gathered, and the queue's other end.
#pragma once

#include "PlexorProviderCfg.h"
#include "device_fixture.h"

namespace plexortest {

/// Said whenever the walk, at its end, waits for the queue to empty.
inline const LogLine kWaiting = debugLine("BuildLogicalDeviceInfo: FIFO not empty, waiting...\n");

class DevicesTest : public DeviceTest {
protected:
    void SetUp() override {
        DeviceTest::SetUp();
        ctrl->ControllerOp = clonedPath(card.system);
        setActiveThreads(1);
        takeInEachSleep(1000);
        startOver();
    }
    void TearDown() override {
        releaseTaken();
        DeviceTest::TearDown();
    }

    static void setActiveThreads(unsigned int count) {
        pthread_mutex_lock(&PlexorThreadMutex);
        ActiveThreads = count;
        pthread_mutex_unlock(&PlexorThreadMutex);
    }
    int walk() {
        releaseTaken();
        startOver();
        return BuildLogicalDeviceInfo(&mi, ctx(), ctrl);
    }
    /// Stands in for the workers: whenever the producer sleeps, this many items leave the queue.
    void takeInEachSleep(int count) {
        VirtualClock::onSleep([this, count](unsigned int) { take(count); });
    }
    void take(int count) {
        for (; count > 0 && !IsFifoEmpty(&__FIFO); count--) {
            taken_.push_back(static_cast<Thread_Args_t*>(GetItem(&__FIFO)));
        }
    }
    void releaseTaken() {
        for (Thread_Args_t* item : taken_) {
            if (item->Func == ProcessBuildLogicalDeviceInfo) {
                ReleaseDeviceItem(item);
            } else {
                free(item);
            }
        }
        taken_.clear();
    }

    static Path pathIn(const Thread_Args_t* item) {
        return testbed::Broker::toPath(reinterpret_cast<const CMPIObjectPath*>(item->Arg3));
    }
    static testbed::Instance instanceIn(const Thread_Args_t* item) {
        return testbed::Broker::toInstance(reinterpret_cast<const CMPIInstance*>(item->Arg4));
    }
    /// "<code> <DeviceID>" of every item that left the queue.
    Texts taken() const {
        Texts texts;
        for (const Thread_Args_t* item : taken_) {
            texts.push_back(std::to_string(item->Arg5) + " " +
                            pathIn(item).findKey("DeviceID")->asString());
        }
        return texts;
    }
    /// Ports "0", "1", … of the controller, and what `taken` gives for them.
    Texts addPorts(int count) {
        Texts expected;
        for (int i = 0; i < count; i++) {
            vendor.port(card, std::to_string(i));
            expected.push_back("2 " + std::to_string(i));
        }
        return expected;
    }
    /// A device of that class, which need not be one of the vendor's usual ones.
    Path addDevice(const std::string& className, const std::string& id) {
        testbed::Instance device;
        device.path = {"root/sample", className, {}};
        device.path.key("DeviceID", testbed::CimValue::string(id));
        device.set("DeviceID", testbed::CimValue::string(id));
        repository.put(device);
        vendor.tie("CIM_SystemDevice", card.system, device.path);
        return device.path;
    }
    void defineClass(const std::string& name, const std::string& superclass) {
        testbed::ClassDefinition definition;
        definition.name = name;
        definition.superclass = superclass;
        repository.defineClass("root/sample", definition);
    }

    std::vector<Thread_Args_t*> taken_;
};

}  // namespace plexortest
