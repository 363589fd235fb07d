// Enumerating instances.
#include <string>
#include <vector>

#include "owned_text.h"
#include "serve_fixture.h"

namespace plexortest {
namespace {

using testbed::CallRecord;
using testbed::Entry;
using testbed::Instance;
using testbed::ObjectPath;
using testbed::PropertyList;
using testbed::Response;

/// Every property of a class, in the order in which it is set.
struct ClassProperties {
    const char* className;
    std::vector<std::string> names;
};

const ClassProperties kProperties[] = {
    {kController,
     {"ElementName", "Caption", "OperationalStatus", "HealthState", "IdentifyingDescriptions",
      "OtherIdentifyingInfo", "Dedicated", "NameFormat"}},
    {kSoftwareIdentity, {"IsEntity", "VersionString", "ElementName", "Caption"}},
    {"Tovexa_PlexorStorageVolume",
     {"ElementName", "Caption", "OperationalStatus", "HealthState", "NameFormat", "Name",
      "NameNameSpace", "BlockSize", "NumberOfBlocks", "ConsumableBlocks",
      "IsBasedOnUnderlyingRedundancy", "NoSinglePointOfFailure", "DataRedundancy",
      "DeltaReservation", "Primordial", "ExtentStatus"}},
    {"Tovexa_PlexorStorageExtent",
     {"ElementName", "Caption", "OperationalStatus", "HealthState", "BlockSize", "NumberOfBlocks",
      "Primordial"}},
    {"Tovexa_PlexorSASSATAPort",
     {"ElementName", "Caption", "OperationalStatus", "HealthState", "PortType",
      "UsageRestriction"}},
    {"Tovexa_PlexorBattery",
     {"ElementName", "Caption", "OperationalStatus", "HealthState", "BatteryStatus"}},
};

class ServeInstances : public ServeTest {
protected:
    Response instances(const std::string& className, const PropertyList& properties = {},
                       const std::string& nameSpace = "root/cimv2") {
        return client().enumerateInstances(className, properties, nameSpace);
    }
    /// Controller "C0" with a device "d1" of each class.
    static RaidController_t* smallInventory() {
        RaidController_t* ctrl = attach(newController("C0"));
        for (const DeviceClass& device : kDeviceClasses) device.cache(ctrl, "d1");
        return ctrl;
    }
};

TEST_F(ServeInstances, OfControllersInListOrder) {
    attach(newController("C1"));
    attach(newController("C0"));
    const Response response = instances(kController);
    const std::vector<std::string> expected = {controllerPath("C1").text(),
                                               controllerPath("C0").text()};
    EXPECT_EQ(expected, pathTexts(response.instances));
    EXPECT_EQ("Controller C1 (Model C1)", property(response.instances.at(0), "ElementName"));
    EXPECT_EQ("Controller C0 (Model C0)", property(response.instances.at(1), "ElementName"));
    EXPECT_EQ(CMPI_RC_OK, response.rc);
    EXPECT_FALSE(response.message);
    EXPECT_EQ(1, response.doneCalls);
    EXPECT_TRUE(response.paths.empty());
    EXPECT_TRUE(refreshRequests().empty());
}

TEST_F(ServeInstances, OfSoftwareIdentitiesInListOrder) {
    attach(newController("C1"));
    attach(newController("C0"));
    const Response response = instances(kSoftwareIdentity);
    const std::vector<std::string> expected = {softwarePath("C1").text(),
                                               softwarePath("C0").text()};
    EXPECT_EQ(expected, pathTexts(response.instances));
    EXPECT_EQ("PKG-C1 (Package); FW-C1 (Fw)", property(response.instances.at(0), "VersionString"));
    EXPECT_EQ("PKG-C0 (Package); FW-C0 (Fw)", property(response.instances.at(1), "VersionString"));
    EXPECT_EQ(1, response.doneCalls);
    EXPECT_TRUE(refreshRequests().empty());
}

TEST_F(ServeInstances, OfDevicesControllerByControllerInListOrder) {
    enumerateDevices([this](const DeviceClass& device, const std::vector<ObjectPath>& expected) {
        const Response response = instances(device.name);
        EXPECT_EQ(texts(expected), pathTexts(response.instances));
        EXPECT_EQ(device.elementName, property(response.instances.at(3), "ElementName"));
        return response;
    });
}

TEST_F(ServeInstances, CarryTheClassNameOfTheProviderAndTheNamespaceOfTheRequest) {
    smallInventory();
    for (const std::string& className : servedClasses()) {
        std::string spelling;
        for (const char letter : className) spelling += static_cast<char>(tolower(letter));
        const Response response = instances(spelling, {}, "root/Other");
        ASSERT_EQ(1u, response.instances.size()) << spelling;
        EXPECT_EQ(className, response.instances[0].path.className);
        EXPECT_EQ("root/Other", response.instances[0].path.nameSpace);
    }
}

TEST_F(ServeInstances, DuplicatesAreAllReturned) {
    smallInventory();
    RaidController_t* twin = smallInventory();
    for (const DeviceClass& device : kDeviceClasses) device.cache(twin, "d1");
    EXPECT_EQ(2u, instances(kController).instances.size());
    EXPECT_EQ(2u, instances(kSoftwareIdentity).instances.size());
    for (const DeviceClass& device : kDeviceClasses) {
        const std::vector<std::string> expected(3, devicePath(device, "C0", "d1").text());
        EXPECT_EQ(expected, pathTexts(instances(device.name).instances));
    }
}

TEST_F(ServeInstances, WithoutPropertyListHaveAllProperties) {
    smallInventory();
    for (const ClassProperties& wanted : kProperties) {
        const Response response = instances(wanted.className);
        ASSERT_EQ(1u, response.instances.size());
        EXPECT_EQ(wanted.names, propertyNames(response.instances[0])) << wanted.className;
    }
}

TEST_F(ServeInstances, WithAPropertyListHaveOnlyThoseOfIt) {
    smallInventory();
    const PropertyList list = {{"Caption", "HealthState", "DeviceID", "NoSuchProperty"}};
    for (const ClassProperties& wanted : kProperties) {
        const Response response = instances(wanted.className, list);
        ASSERT_EQ(1u, response.instances.size());
        std::vector<std::string> expected = {"Caption"};
        if (wanted.className != std::string(kSoftwareIdentity)) expected.push_back("HealthState");
        EXPECT_EQ(expected, propertyNames(response.instances[0])) << wanted.className;
    }
}

TEST_F(ServeInstances, WithAnEmptyPropertyListHaveKeysOnly) {
    smallInventory();
    for (const DeviceClass& device : kDeviceClasses) {
        const Response response = instances(device.name, PropertyList{std::vector<std::string>{}});
        ASSERT_EQ(1u, response.instances.size());
        EXPECT_TRUE(response.instances[0].properties.empty());
        EXPECT_EQ(devicePath(device, "C0", "d1").text(), response.instances[0].path.text());
    }
}

/// The calls of one kind of device's request, without those that read the request's own path.
std::vector<Entry> callsThatMakeInstances(const testbed::Books& books) {
    std::vector<Entry> found;
    for (const CallRecord& call : books.calls()) {
        switch (call.entry) {
            case Entry::PathToString:
            case Entry::PathGetClassName:
            case Entry::PathGetNameSpace:
            case Entry::StringGetCharPtr:
            // The look whether the manager copies keys, in the build for standard managers.
            case Entry::InstanceGetProperty:
            case Entry::OtherObjectCall:
                break;
            default:
                // One run of properties is one step.
                if (call.entry != Entry::InstanceSetProperty || found.empty() ||
                    found.back() != call.entry) {
                    found.push_back(call.entry);
                }
        }
    }
    return found;
}

TEST_F(ServeInstances, AreMadeOnAFilledPathAndFilteredBeforeTheyAreRendered) {
    smallInventory();
    books().recordObjectCalls(true);
    const PropertyList list = {{"ElementName", "BatteryStatus"}};
    for (const bool filtered : {false, true}) {
        books().clearCalls();
        instances("Tovexa_PlexorBattery", filtered ? list : PropertyList{});
        std::vector<Entry> expected = {Entry::NewObjectPath, Entry::PathAddKey, Entry::PathAddKey,
                                       Entry::PathAddKey,    Entry::PathAddKey, Entry::NewInstance};
        if (filtered) expected.push_back(Entry::InstanceSetPropertyFilter);
        expected.insert(expected.end(), {Entry::InstanceSetProperty, Entry::NewArray,
                                         Entry::ArraySetElementAt, Entry::InstanceSetProperty,
                                         Entry::ResultReturnInstance, Entry::ResultReturnDone});
        EXPECT_EQ(expected, callsThatMakeInstances(books()));
    }
}

TEST_F(ServeInstances, ArePropertyByPropertySetInOrderOnRealInstances) {
    smallInventory();
    books().recordObjectCalls(true);
    for (const ClassProperties& wanted : kProperties) {
        books().clearCalls();
        instances(wanted.className);
        std::vector<std::string> set;
        for (const CallRecord& call : books().calls()) {
            if (call.entry == Entry::InstanceSetProperty) set.push_back(call.name.value_or(""));
        }
        EXPECT_EQ(wanted.names, set) << wanted.className;
    }
}

TEST_F(ServeInstances, NeverAskTheVendor) {
    smallInventory();
    for (const std::string& className : servedClasses()) instances(className);
    EXPECT_TRUE(books().queries().empty());
}

TEST_F(ServeInstances, KeepNothingOfTheBrokers) {
    smallInventory();
    books().recordObjectCalls(true);
    for (const std::string& className : servedClasses()) instances(className);
    EXPECT_EQ(0u, books().count(Entry::Clone));
    EXPECT_EQ(0u, books().count(Entry::Release));
}

TEST_F(ServeInstances, ShowWhatTheRecordsHoldNow) {
    RaidController_t* ctrl = smallInventory();
    auto* battery = static_cast<Battery_t*>(ctrl->BatteryList->Head->Data);
    battery->OperationalStatus = 6;
    EXPECT_EQ("30", property(instances("Tovexa_PlexorBattery").instances.at(0), "HealthState"));
    battery->OperationalStatus = 12;
    EXPECT_EQ("20", property(instances("Tovexa_PlexorBattery").instances.at(0), "HealthState"));
}

}  // namespace
}  // namespace plexortest
