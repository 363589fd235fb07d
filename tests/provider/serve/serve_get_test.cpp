// Getting one instance by its path.
#include <string>

#include "owned_text.h"
#include "serve_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::ObjectPath;
using testbed::PropertyList;
using testbed::Response;

class ServeGet : public ServeTest {
protected:
    Response get(const ObjectPath& path, const PropertyList& properties = {}) {
        CapturedSyslog::clear();
        return client().getInstance(path, properties);
    }
    void expectNotFound(const Response& response) {
        EXPECT_EQ(CMPI_RC_ERR_NOT_FOUND, response.rc);
        EXPECT_FALSE(response.message);
        EXPECT_EQ(0, response.doneCalls);
        EXPECT_TRUE(response.instances.empty());
        EXPECT_EQ("PlexorProviderGetInstance: exiting\n", CapturedSyslog::lines().back().text);
    }
};

TEST_F(ServeGet, FindsAController) {
    for (const char* id : {"C0", "C1", "C2"}) attach(newController(id));
    const Response response = get(controllerPath("C1"));
    EXPECT_EQ(CMPI_RC_OK, response.rc);
    EXPECT_FALSE(response.message);
    EXPECT_EQ(1, response.doneCalls);
    ASSERT_EQ(1u, response.instances.size());
    EXPECT_EQ(controllerPath("C1").text(), response.instances[0].path.text());
    EXPECT_EQ("Controller C1 (Model C1)", property(response.instances[0], "ElementName"));
    EXPECT_TRUE(refreshRequests().empty());
}

TEST_F(ServeGet, FindsASoftwareIdentity) {
    for (const char* id : {"C0", "C1", "C2"}) attach(newController(id));
    const Response response = get(softwarePath("C2"));
    EXPECT_EQ(CMPI_RC_OK, response.rc);
    EXPECT_EQ(1, response.doneCalls);
    ASSERT_EQ(1u, response.instances.size());
    EXPECT_EQ(softwarePath("C2").text(), response.instances[0].path.text());
    EXPECT_EQ("PKG-C2 (Package); FW-C2 (Fw)", property(response.instances[0], "VersionString"));
    EXPECT_TRUE(refreshRequests().empty());
}

TEST_F(ServeGet, FindsADeviceAndAsksForARefreshOfItsControllerOnly) {
    RaidController_t* first = attach(newController("C0"));
    RaidController_t* second = attach(newController("C1"));
    for (const DeviceClass& device : kDeviceClasses) {
        for (const char* id : {"d1", "d2"}) {
            device.cache(first, id);
            device.cache(second, id);
        }
        const Response response = get(devicePath(device, "C0", "d1"));
        EXPECT_EQ(CMPI_RC_OK, response.rc);
        EXPECT_FALSE(response.message);
        EXPECT_EQ(1, response.doneCalls);
        ASSERT_EQ(1u, response.instances.size());
        EXPECT_EQ(devicePath(device, "C0", "d1").text(), response.instances[0].path.text());
        EXPECT_EQ(device.elementName, property(response.instances[0], "ElementName"));
        EXPECT_EQ(std::vector<std::string>{refreshRequest("C0", device.action)}, refreshRequests());
    }
}

TEST_F(ServeGet, DuplicateControllersAreAllReturned) {
    for (const char* id : {"C0", "C1", "C0"}) attach(newController(id));
    setText(static_cast<RaidController_t*>(RaidControllerList->Tail->Data)->Model, "twin");
    for (const ObjectPath& path : {controllerPath("C0"), softwarePath("C0")}) {
        const Response response = get(path);
        ASSERT_EQ(2u, response.instances.size());
        EXPECT_EQ("Controller C0 (Model C0)", property(response.instances[0], "ElementName"));
        EXPECT_EQ("Controller C0 (twin)", property(response.instances[1], "ElementName"));
        EXPECT_EQ(1, response.doneCalls);
    }
}

TEST_F(ServeGet, DuplicateDevicesAreAllReturned) {
    RaidController_t* first = attach(newController("C0"));
    attach(newController("C1"));
    RaidController_t* twin = attach(newController("C0"));
    for (const DeviceClass& device : kDeviceClasses) {
        for (const char* id : {"d1", "d2", "d1"}) device.cache(first, id);
        device.cache(twin, "d1");
        const Response response = get(devicePath(device, "C0", "d1"));
        const std::vector<std::string> expected(3, devicePath(device, "C0", "d1").text());
        EXPECT_EQ(expected, pathTexts(response.instances));
        EXPECT_EQ(1, response.doneCalls);
        const std::vector<std::string> refreshes(2, refreshRequest("C0", device.action));
        EXPECT_EQ(refreshes, refreshRequests());
    }
}

TEST_F(ServeGet, FindsDevicesAmongVeryManyAndAllDuplicatesOfThem) {
    RaidController_t* ctrl = attach(newController("C0"));
    for (const DeviceClass& device : kDeviceClasses) {
        for (int i = 0; i < 200; i++) device.cache(ctrl, std::to_string(i % 150).c_str());
        for (const auto& [id, times] : {std::pair("0", 2), {"49", 2}, {"50", 1}, {"149", 1}}) {
            const Response response = get(devicePath(device, "C0", id));
            const std::vector<std::string> expected(times, devicePath(device, "C0", id).text());
            EXPECT_EQ(expected, pathTexts(response.instances));
            EXPECT_EQ(std::vector<std::string>{refreshRequest("C0", device.action)},
                      refreshRequests());
        }
        expectNotFound(get(devicePath(device, "C0", "150")));
        expectNotFound(get(devicePath(device, "C0", "")));
    }
}

TEST_F(ServeGet, OfAnUnknownDeviceStillAsksForARefresh) {
    RaidController_t* ctrl = attach(newController("C0"));
    attach(newController("C1"));
    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(ctrl, "d1");
        expectNotFound(get(devicePath(device, "C0", "d2")));
        EXPECT_EQ(std::vector<std::string>{refreshRequest("C0", device.action)}, refreshRequests());
        EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
    }
}

TEST_F(ServeGet, OfAnUnknownControllerAsksForNothing) {
    RaidController_t* ctrl = attach(newController("C0"));
    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(ctrl, "d1");
        expectNotFound(get(devicePath(device, "C9", "d1")));
        EXPECT_TRUE(refreshRequests().empty());
    }
    expectNotFound(get(controllerPath("C9")));
    expectNotFound(get(softwarePath("C9")));
    EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
}

TEST_F(ServeGet, ComparesIdsWithCaseAndAsAWhole) {
    RaidController_t* ctrl = attach(newController("Ctl0"));
    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(ctrl, "dev1");
        for (const char* id : {"DEV1", "dev", "dev10", "1"}) {
            expectNotFound(get(devicePath(device, "Ctl0", id)));
        }
        for (const char* id : {"CTL0", "Ctl", "Ctl00"}) {
            expectNotFound(get(devicePath(device, id, "dev1")));
        }
        EXPECT_EQ(CMPI_RC_OK, get(devicePath(device, "Ctl0", "dev1")).rc);
    }
    for (const char* id : {"CTL0", "Ctl", "Ctl00"}) {
        expectNotFound(get(controllerPath(id)));
        expectNotFound(get(softwarePath(id)));
    }
}

TEST_F(ServeGet, LooksAtNoOtherKeyThanTheOneThatNamesTheInstance) {
    RaidController_t* ctrl = attach(newController("C0"));
    ObjectPath path = {"root/x", kController, {{"Name", CimValue::string("tvxControllerC0")}}};
    EXPECT_EQ(CMPI_RC_OK, get(path).rc);
    path.key("CreationClassName", CimValue::string("Somebody_ElsesController"));
    const Response response = get(path);
    ASSERT_EQ(1u, response.instances.size());
    // The keys of the answer are the provider's own.
    ObjectPath expected = controllerPath("C0");
    expected.nameSpace = "root/x";
    EXPECT_EQ(expected.text(), response.instances[0].path.text());

    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(ctrl, "d1");
        ObjectPath devPath = devicePath(device, "C0", "d1");
        for (const char* key : {"SystemCreationClassName", "SystemName", "CreationClassName"}) {
            devPath.key(key, CimValue::string("something else"));
        }
        const Response found = get(devPath);
        ASSERT_EQ(1u, found.instances.size());
        EXPECT_EQ(devicePath(device, "C0", "d1").text(), found.instances[0].path.text());
        devPath.keys = {{"DeviceID", CimValue::string(std::string(device.prefix) + "C0_d1")}};
        EXPECT_EQ(1u, get(devPath).instances.size());
    }
}

TEST_F(ServeGet, AcceptsAnyLetterCaseOfTheClassName) {
    RaidController_t* ctrl = attach(newController("C0"));
    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(ctrl, "d1");
        ObjectPath path = devicePath(device, "C0", "d1");
        for (char& letter : path.className) letter = static_cast<char>(toupper(letter));
        const Response response = get(path);
        ASSERT_EQ(1u, response.instances.size());
        EXPECT_EQ(device.name, response.instances[0].path.className);
    }
}

TEST_F(ServeGet, AppliesThePropertyList) {
    RaidController_t* ctrl = attach(newController("C0"));
    const PropertyList list = {{"elementname", "NoSuchProperty"}};
    const std::vector<std::string> wanted = {"ElementName"};
    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(ctrl, "d1");
        const ObjectPath path = devicePath(device, "C0", "d1");
        EXPECT_EQ(wanted, propertyNames(get(path, list).instances.at(0)));
        EXPECT_LT(4u, get(path).instances.at(0).properties.size());
    }
    EXPECT_EQ(wanted, propertyNames(get(controllerPath("C0"), list).instances.at(0)));
    EXPECT_EQ(8u, get(controllerPath("C0")).instances.at(0).properties.size());
    EXPECT_EQ(wanted, propertyNames(get(softwarePath("C0"), list).instances.at(0)));
    EXPECT_EQ(4u, get(softwarePath("C0")).instances.at(0).properties.size());
}

TEST_F(ServeGet, FindsDevicesWithAnUnderscoreInTheirId) {
    RaidController_t* ctrl = attach(newController("AB"));
    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(ctrl, "C_D");
        EXPECT_EQ(CMPI_RC_OK, get(devicePath(device, "AB", "C_D")).rc);
    }
}

TEST_F(ServeGet, CannotFindTheDevicesOfAControllerWithAnUnderscoreInItsId) {
    RaidController_t* ctrl = attach(newController("CA_B"));
    for (const DeviceClass& device : kDeviceClasses) {
        device.cache(ctrl, "d1");
        const Response names = client().enumerateInstanceNames(device.name);
        ASSERT_EQ(1u, names.paths.size());
        expectNotFound(get(names.paths[0]));
        EXPECT_TRUE(refreshRequests().empty());
    }
}

TEST_F(ServeGet, RecordsWithoutIdMatchNothing) {
    RaidController_t* nameless = attach(newController("C0"));
    setText(nameless->DeviceID, nullptr);
    RaidController_t* ctrl = attach(newController("C0"));
    attach(ctrl, newBattery(nullptr));
    attach(ctrl, newBattery("d1"));
    EXPECT_EQ(
        1u,
        get(deviceKeyPath("Tovexa_PlexorBattery", "tvxControllerBatteryC0_d1")).instances.size());
    EXPECT_EQ(1u, get(controllerPath("C0")).instances.size());
    EXPECT_EQ(1u, get(softwarePath("C0")).instances.size());
}

TEST_F(ServeGet, OfWhatAnEnumerationNamedFindsIt) {
    for (const char* id : {"C0", "C1"}) {
        RaidController_t* ctrl = attach(newController(id));
        for (const DeviceClass& device : kDeviceClasses) {
            for (const char* deviceId : {"d1", "d2"}) device.cache(ctrl, deviceId);
        }
    }
    for (const std::string& className : servedClasses()) {
        for (const ObjectPath& path : client().enumerateInstanceNames(className).paths) {
            const Response response = get(path);
            ASSERT_EQ(1u, response.instances.size());
            EXPECT_EQ(path.text(), response.instances[0].path.text());
        }
    }
}

}  // namespace
}  // namespace plexortest
