// Enumerating the names of instances.
#include <string>

#include "serve_fixture.h"

namespace plexortest {
namespace {

using testbed::ObjectPath;
using testbed::Response;

class ServeNames : public ServeTest {
protected:
    Response names(const std::string& className, const std::string& nameSpace = "root/cimv2") {
        return client().enumerateInstanceNames(className, nameSpace);
    }
};

TEST_F(ServeNames, OfControllersInListOrder) {
    for (const char* id : {"C1", "C0", "C10"}) attach(newController(id));
    const Response response = names(kController);
    const std::vector<ObjectPath> expected = {controllerPath("C1"), controllerPath("C0"),
                                              controllerPath("C10")};
    EXPECT_EQ(texts(expected), texts(response.paths));
    EXPECT_EQ(CMPI_RC_OK, response.rc);
    EXPECT_FALSE(response.message);
    EXPECT_EQ(1, response.doneCalls);
    EXPECT_TRUE(response.instances.empty());
    EXPECT_TRUE(refreshRequests().empty());
}

TEST_F(ServeNames, OfSoftwareIdentitiesInListOrder) {
    for (const char* id : {"C1", "C0"}) attach(newController(id));
    const Response response = names(kSoftwareIdentity);
    const std::vector<ObjectPath> expected = {softwarePath("C1"), softwarePath("C0")};
    EXPECT_EQ(texts(expected), texts(response.paths));
    EXPECT_EQ(CMPI_RC_OK, response.rc);
    EXPECT_EQ(1, response.doneCalls);
    EXPECT_TRUE(refreshRequests().empty());
}

TEST_F(ServeNames, OfDevicesControllerByControllerInListOrder) {
    enumerateDevices([this](const DeviceClass& device, const std::vector<ObjectPath>& expected) {
        const Response response = names(device.name);
        EXPECT_EQ(texts(expected), texts(response.paths));
        return response;
    });
}

TEST_F(ServeNames, DuplicatesAreAllReturned) {
    RaidController_t* first = attach(newController("C0"));
    RaidController_t* second = attach(newController("C0"));
    EXPECT_EQ(2u, names(kController).paths.size());
    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(first, "d1");
        device.cache(first, "d1");
        device.cache(second, "d1");
        const std::vector<ObjectPath> expected(3, devicePath(device, "C0", "d1"));
        EXPECT_EQ(texts(expected), texts(names(device.name).paths));
    }
}

TEST_F(ServeNames, OfDrivesComeFromTheDiskListNotTheExtentList) {
    RaidController_t* ctrl = attach(newController("C0"));
    attach(ctrl, newDisk("d1"));
    DiskDrive_t* extent = newDisk("e1");
    ctrl->ExtentList = &ctrl->__ExtentList;
    AddEntryAtListTail(ctrl->ExtentList, extent);
    const std::vector<ObjectPath> expected = {
        deviceKeyPath("Tovexa_PlexorStorageExtent", "tvxStorageExtC0_d1")};
    EXPECT_EQ(texts(expected), texts(names("Tovexa_PlexorStorageExtent").paths));
    FreeList(ctrl->ExtentList, FreeDisk);
}

TEST_F(ServeNames, CarryTheClassNameOfTheProviderAndTheNamespaceOfTheRequest) {
    RaidController_t* ctrl = attach(newController("C0"));
    for (const DeviceClass& device : kDeviceClasses) device.cache(ctrl, "d1");
    for (const std::string& className : servedClasses()) {
        std::string lower, upper;
        for (const char letter : className) {
            lower += static_cast<char>(tolower(letter));
            upper += static_cast<char>(toupper(letter));
        }
        for (const std::string& spelling : {lower, upper}) {
            const Response response = names(spelling, "root/Other");
            ASSERT_EQ(1u, response.paths.size()) << spelling;
            EXPECT_EQ(className, response.paths[0].className);
            EXPECT_EQ("root/Other", response.paths[0].nameSpace);
        }
    }
}

TEST_F(ServeNames, OfAControllerWithoutDevicesAskForARefreshAllTheSame) {
    attach(newController("C0"));
    for (const DeviceClass& device : kDeviceClasses) {
        CapturedSyslog::clear();
        const Response response = names(device.name);
        EXPECT_TRUE(response.paths.empty());
        EXPECT_EQ(1, response.doneCalls);
        EXPECT_EQ(std::vector<std::string>{refreshRequest("C0", device.action)}, refreshRequests());
    }
}

TEST_F(ServeNames, WithoutHostIdentityHaveNullKeys) {
    RaidController_t* ctrl = attach(newController("C0"));
    attach(ctrl, newDisk("d1"));
    ReleaseSystemInfo();
    const Response response = names("Tovexa_PlexorStorageExtent");
    ASSERT_EQ(1u, response.paths.size());
    const std::vector<testbed::NamedValue> expected = {
        {"SystemCreationClassName", testbed::CimValue::null(CMPI_string)},
        {"SystemName", testbed::CimValue::null(CMPI_string)},
        {"CreationClassName", testbed::CimValue::string("Tovexa_PlexorStorageExtent")},
        {"DeviceID", testbed::CimValue::string("tvxStorageExtC0_d1")}};
    EXPECT_EQ(expected, response.paths[0].keys);
}

TEST_F(ServeNames, LongIdsAreCutAt255CharactersOfTheKey) {
    RaidController_t* ctrl = attach(newController("C0"));
    attach(ctrl, newPort(std::string(65536, 'p').c_str()));
    const Response response = names("Tovexa_PlexorSASSATAPort");
    const std::vector<ObjectPath> expected = {
        deviceKeyPath("Tovexa_PlexorSASSATAPort", "tvxPortC0_" + std::string(245, 'p'))};
    EXPECT_EQ(texts(expected), texts(response.paths));
}

TEST_F(ServeNames, MakeNoInstances) {
    RaidController_t* ctrl = attach(newController("C0"));
    for (const DeviceClass& device : kDeviceClasses) device.cache(ctrl, "d1");
    books().recordObjectCalls(true);
    for (const std::string& className : servedClasses()) names(className);
    EXPECT_EQ(6u, books().count(testbed::Entry::NewObjectPath));
    EXPECT_EQ(6u, books().count(testbed::Entry::ResultReturnObjectPath));
    EXPECT_EQ(0u, books().count(testbed::Entry::NewInstance));
    EXPECT_EQ(0u, books().count(testbed::Entry::ResultReturnInstance));
    EXPECT_EQ(0u, books().count(testbed::Entry::InstanceSetProperty));
}

TEST_F(ServeNames, NeverAskTheVendor) {
    RaidController_t* ctrl = attach(newController("C0"));
    for (const DeviceClass& device : kDeviceClasses) device.cache(ctrl, "d1");
    for (const std::string& className : servedClasses()) names(className);
    EXPECT_TRUE(books().queries().empty());
}

}  // namespace
}  // namespace plexortest
