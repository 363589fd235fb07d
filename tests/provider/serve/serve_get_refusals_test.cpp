// Paths that a get refuses because of their key.
#include <string>
#include <vector>

#include "serve_fixture.h"

namespace plexortest {
namespace {

using testbed::CimValue;
using testbed::ObjectPath;
using testbed::Response;

class ServeGetRefusals : public ServeTest {
protected:
    void SetUp() override {
        ServeTest::SetUp();
        RaidController_t* ctrl = attach(newController("C0"));
        RaidController_t* shortNamed = attach(newController("0"));
        for (const DeviceClass& device : kDeviceClasses) {
            device.cache(ctrl, "d1");
            device.cache(shortNamed, "1");
        }
    }
    /// Expects the get to be refused as an invalid path, with those errors before the last one.
    void expectInvalid(const ObjectPath& path, std::vector<std::string> errors) {
        CapturedSyslog::clear();
        const Response response = client().getInstance(path);
        EXPECT_EQ(CMPI_RC_ERR_NOT_FOUND, response.rc) << path.text();
        EXPECT_FALSE(response.message);
        EXPECT_EQ(0, response.doneCalls);
        EXPECT_TRUE(response.instances.empty());
        errors.push_back("Object path " + path.text() + " invalid\n");
        EXPECT_EQ(errors, CapturedSyslog::linesAt(LOG_ERR)) << path.text();
        const LogLine exiting = {LOG_DEBUG, "PlexorProviderGetInstance: exiting\n"};
        EXPECT_EQ(exiting, CapturedSyslog::lines().back());
        EXPECT_TRUE(refreshRequests().empty());
    }
    static ObjectPath pathWithKey(const std::string& className, const char* key, CimValue value) {
        return {"root/cimv2", className, {{key, std::move(value)}}};
    }
};

TEST_F(ServeGetRefusals, OfPathsWithoutTheKey) {
    const ObjectPath controller = {"root/cimv2", kController, {}};
    expectInvalid(controller, {"Name key not found in object path " + controller.text() + "\n"});
    const ObjectPath software = {"root/cimv2", kSoftwareIdentity, {}};
    expectInvalid(software, {"InstanceID key not found in object path " + software.text() + "\n"});
    for (const DeviceClass& device : kDeviceClasses) {
        const ObjectPath path =
            pathWithKey(device.name, "SystemName", CimValue::string("host1.example"));
        expectInvalid(path, {"DeviceID key not found in object path " + path.text() + "\n"});
    }
}

TEST_F(ServeGetRefusals, OfTheKeyOfAnotherClass) {
    const char* const keys[] = {"tvxControllerC0",       "tovexa:ControllerSoftwareC0",
                                "tvxStorageVolumeC0_d1", "tvxStorageExtC0_d1",
                                "tvxPortC0_d1",          "tvxControllerBatteryC0_d1"};
    for (const DeviceClass& device : kDeviceClasses) {
        for (const std::string key : keys) {
            if (key.starts_with(device.prefix)) continue;
            expectInvalid(deviceKeyPath(device.name, key), {});
        }
        expectInvalid(deviceKeyPath(device.name, ""), {});
        expectInvalid(deviceKeyPath(device.name, "C0_d1"), {});
    }
    for (const std::string key : keys) {
        if (!key.starts_with("tvxController")) {
            expectInvalid(pathWithKey(kController, "Name", CimValue::string(key)), {});
        }
        if (!key.starts_with("tovexa:")) {
            expectInvalid(pathWithKey(kSoftwareIdentity, "InstanceID", CimValue::string(key)), {});
        }
    }
}

TEST_F(ServeGetRefusals, OfAPrefixInAnotherLetterCase) {
    expectInvalid(deviceKeyPath("Tovexa_PlexorBattery", "TVXControllerBatteryC0_d1"), {});
    expectInvalid(pathWithKey(kController, "Name", CimValue::string("TvxControllerC0")), {});
}

TEST_F(ServeGetRefusals, OfAKeyThatIsOnlyItsPrefix) {
    expectInvalid(pathWithKey(kController, "Name", CimValue::string("tvxController")),
                  {"No valid info in key key tvxController\n"});
    expectInvalid(
        pathWithKey(kSoftwareIdentity, "InstanceID", CimValue::string("tovexa:ControllerSoftware")),
        {"No valid info in key key tovexa:ControllerSoftware\n"});
    for (const DeviceClass& device : kDeviceClasses) {
        expectInvalid(deviceKeyPath(device.name, device.prefix),
                      {"No valid info in key key " + std::string(device.prefix) + "\n"});
    }
}

TEST_F(ServeGetRefusals, OfADeviceKeyThatIsMalformed) {
    for (const DeviceClass& device : kDeviceClasses) {
        const std::string prefix = device.prefix;
        expectInvalid(deviceKeyPath(device.name, prefix + "C0d1"),
                      {"Device ID not found in key " + prefix + "C0d1\n"});
        expectInvalid(deviceKeyPath(device.name, prefix + "C0_"),
                      {"Device ID empty in key " + prefix + "C0_\n"});
    }
}

TEST_F(ServeGetRefusals, OfAOneCharacterControllerIdAlthoughThereIsOne) {
    for (const DeviceClass& device : kDeviceClasses) {
        const std::string key = std::string(device.prefix) + "0_1";
        expectInvalid(deviceKeyPath(device.name, key),
                      {"Controller ID not found in key " + key + "\n"});
    }
}

TEST_F(ServeGetRefusals, AnEmptyControllerIdMatchesNone) {
    for (const DeviceClass& device : kDeviceClasses) {
        CapturedSyslog::clear();
        const Response response =
            client().getInstance(deviceKeyPath(device.name, std::string(device.prefix) + "_d1"));
        EXPECT_EQ(CMPI_RC_ERR_NOT_FOUND, response.rc);
        EXPECT_EQ(0, response.doneCalls);
        EXPECT_TRUE(CapturedSyslog::linesAt(LOG_ERR).empty());
        EXPECT_TRUE(refreshRequests().empty());
    }
}

TEST_F(ServeGetRefusals, OfKeysThatAreNoText) {
    const CimValue values[] = {CimValue::null(CMPI_string), CimValue::boolean(true),
                               CimValue::uint64(0xFFFFFFFFFFFFFFFFu),
                               CimValue::signedInteger(CMPI_sint64, -1)};
    for (const CimValue& value : values) {
        expectInvalid(pathWithKey(kController, "Name", value), {});
        expectInvalid(pathWithKey(kSoftwareIdentity, "InstanceID", value), {});
        for (const DeviceClass& device : kDeviceClasses) {
            expectInvalid(pathWithKey(device.name, "DeviceID", value), {});
        }
    }
}

TEST_F(ServeGetRefusals, PercentSignsInKeysAreOnlyText) {
    expectInvalid(deviceKeyPath("Tovexa_PlexorBattery", "tvxControllerBattery%s%n"),
                  {"Device ID not found in key tvxControllerBattery%s%n\n"});
}

}  // namespace
}  // namespace plexortest
