// An inventory that requests are answered from, and the requests.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "cim_object.h"
#include "instance_client.h"
#include "provider_fixture.h"

namespace plexortest {

/// A device class as clients know it.
struct DeviceClass {
    const char* name;
    const char* prefix;  ///< of its DeviceID key
    int action;          ///< of its refresh
    /// Appends a record with that identifier to the list that the class is served from.
    void (*cache)(RaidController_t* ctrl, const char* deviceId);
    /// ElementName of a device "d1" of controller "C0", as `cache` leaves it.
    const char* elementName;
};

inline constexpr DeviceClass kDeviceClasses[] = {
    {"Tovexa_PlexorStorageVolume", "tvxStorageVolume", 101,
     [](RaidController_t* ctrl, const char* id) { attach(ctrl, newVolume(id)); },
     "RAID5 Volume d1 Logical Volume d1 on controller C0 - OPTIMAL"},
    {"Tovexa_PlexorStorageExtent", "tvxStorageExt", 100,
     [](RaidController_t* ctrl, const char* id) { attach(ctrl, newDisk(id)); },
     "Drive d1 on controller C0 Fw: FW1 - ONLINE"},
    {"Tovexa_PlexorSASSATAPort", "tvxPort", 102,
     [](RaidController_t* ctrl, const char* id) { attach(ctrl, newPort(id)); },
     "Port d1 on Controller C0"},
    {"Tovexa_PlexorBattery", "tvxControllerBattery", 103,
     [](RaidController_t* ctrl, const char* id) { attach(ctrl, newBattery(id)); },
     "Battery d1 on Controller C0"},
};

inline constexpr const char* kController = "Tovexa_PlexorController";
inline constexpr const char* kSoftwareIdentity = "Tovexa_PlexorSoftwareIdentity";

/// The six served classes.
inline std::vector<std::string> servedClasses() {
    std::vector<std::string> names = {kController, kSoftwareIdentity};
    for (const DeviceClass& device : kDeviceClasses) names.push_back(device.name);
    return names;
}

class ServeTest : public ProviderTest {
protected:
    void SetUp() override {
        ProviderTest::SetUp();
        __SystemName = ownedCopy("host1.example");
        __SystemClassName = ownedCopy("OMC_UnitaryComputerSystem");
    }

    testbed::InstanceClient client() { return {broker, &mi}; }

    // Paths as clients see them, keys in their order.
    static testbed::ObjectPath controllerPath(const std::string& ctrlId) {
        return {"root/cimv2",
                kController,
                {{"CreationClassName", testbed::CimValue::string(kController)},
                 {"Name", testbed::CimValue::string("tvxController" + ctrlId)}}};
    }
    static testbed::ObjectPath softwarePath(const std::string& ctrlId) {
        return {"root/cimv2",
                kSoftwareIdentity,
                {{"InstanceID", testbed::CimValue::string("tovexa:ControllerSoftware" + ctrlId)}}};
    }
    static testbed::ObjectPath devicePath(const DeviceClass& device, const std::string& ctrlId,
                                          const std::string& deviceId) {
        return deviceKeyPath(device.name, device.prefix + ctrlId + "_" + deviceId);
    }
    static testbed::ObjectPath deviceKeyPath(const std::string& className,
                                             const std::string& deviceIdKey) {
        return {
            "root/cimv2",
            className,
            {{"SystemCreationClassName", testbed::CimValue::string("OMC_UnitaryComputerSystem")},
             {"SystemName", testbed::CimValue::string("host1.example")},
             {"CreationClassName", testbed::CimValue::string(className)},
             {"DeviceID", testbed::CimValue::string(deviceIdKey)}}};
    }

    /// Caches devices of each class under two controllers and has `ask` enumerate them, which gets
    /// the class and the paths in their order. Every answer is whole, and asks for refreshes.
    static void enumerateDevices(
        const std::function<testbed::Response(
            const DeviceClass& device, const std::vector<testbed::ObjectPath>& expected)>& ask) {
        RaidController_t* first = attach(newController("C1"));
        RaidController_t* second = attach(newController("C0"));
        for (const DeviceClass& device : kDeviceClasses) {
            for (const char* id : {"d2", "d1", "d10"}) device.cache(first, id);
            device.cache(second, "d1");
            CapturedSyslog::clear();
            const testbed::Response response =
                ask(device, {devicePath(device, "C1", "d2"), devicePath(device, "C1", "d1"),
                             devicePath(device, "C1", "d10"), devicePath(device, "C0", "d1")});
            EXPECT_EQ(CMPI_RC_OK, response.rc);
            EXPECT_FALSE(response.message);
            EXPECT_EQ(1, response.doneCalls);
            const std::vector<std::string> refreshes = {refreshRequest("C1", device.action),
                                                        refreshRequest("C0", device.action)};
            EXPECT_EQ(refreshes, refreshRequests());
        }
    }

    /// Path texts, which show namespace, class, and the keys in their order.
    static std::vector<std::string> texts(const std::vector<testbed::ObjectPath>& paths) {
        std::vector<std::string> found;
        for (const testbed::ObjectPath& path : paths) found.push_back(path.text());
        return found;
    }
    static std::vector<std::string> pathTexts(const std::vector<testbed::Instance>& instances) {
        std::vector<std::string> found;
        for (const testbed::Instance& instance : instances) found.push_back(instance.path.text());
        return found;
    }
    static std::vector<std::string> propertyNames(const testbed::Instance& instance) {
        std::vector<std::string> found;
        for (const testbed::NamedValue& property : instance.properties) {
            found.push_back(property.first);
        }
        return found;
    }
    /// Text of a property; "<absent>" without it.
    static std::string property(const testbed::Instance& instance, const char* name) {
        const testbed::CimValue* value = instance.find(name);
        return value != nullptr ? value->text() : "<absent>";
    }

    /// The lines with which refreshes were asked for, in order.
    static std::vector<std::string> refreshRequests() {
        std::vector<std::string> found;
        for (const std::string& line : CapturedSyslog::linesAt(LOG_DEBUG)) {
            if (line.starts_with("HandleDeviceConfigChange: ENTER")) found.push_back(line);
        }
        return found;
    }
    static std::string refreshRequest(const std::string& ctrlId, int action) {
        return "HandleDeviceConfigChange: ENTER. ctrl " + ctrlId + ", action " +
               std::to_string(action) + "\n";
    }
};

/// One of the three served operations, asked for a class, or for one instance of it.
struct Operation {
    const char* name;  ///< of the function that serves it
    testbed::Response (*ask)(testbed::InstanceClient client, const testbed::ObjectPath& path);
};

inline const std::vector<Operation>& enumerations() {
    static const std::vector<Operation> operations = {
        {"PlexorProviderEnumInstanceNames",
         [](testbed::InstanceClient client, const testbed::ObjectPath& path) {
             return client.enumerateInstanceNames(path.className, path.nameSpace);
         }},
        {"PlexorProviderEnumInstances",
         [](testbed::InstanceClient client, const testbed::ObjectPath& path) {
             return client.enumerateInstances(path.className, {}, path.nameSpace);
         }},
    };
    return operations;
}

inline const Operation& getOperation() {
    static const Operation operation = {
        "PlexorProviderGetInstance",
        [](testbed::InstanceClient client, const testbed::ObjectPath& path) {
            return client.getInstance(path);
        }};
    return operation;
}

inline std::vector<Operation> allOperations() {
    std::vector<Operation> operations = enumerations();
    operations.push_back(getOperation());
    return operations;
}

}  // namespace plexortest
