// Requests while the broker or the allocator fails.
#include <string>

#include "serve_fixture.h"

namespace plexortest {
namespace {

using testbed::Entry;
using testbed::FaultRule;
using testbed::Response;

class ServeFailures : public ServeTest {
protected:
    void SetUp() override {
        ServeTest::SetUp();
        for (const char* id : {"C0", "C1"}) {
            RaidController_t* ctrl = attach(newController(id));
            for (const DeviceClass& device : kDeviceClasses) {
                for (const char* deviceId : {"d1", "d2"}) device.cache(ctrl, deviceId);
            }
        }
    }
    /// The entry answers NULL with a good status, for ever or for the second call only.
    void answerNull(Entry entry, bool secondOnly = false) {
        FaultRule rule;
        rule.entry = entry;
        rule.nullResult = true;
        if (secondOnly) {
            rule.skip = 1;
            rule.times = 1;
        }
        faults().add(rule);
    }
    static size_t recordsOf(const std::string& className) {
        return className == kController || className == kSoftwareIdentity ? 2 : 4;
    }
    testbed::ObjectPath pathOf(const std::string& className) {
        if (className == kController) return controllerPath("C0");
        if (className == kSoftwareIdentity) return softwarePath("C0");
        for (const DeviceClass& device : kDeviceClasses) {
            if (className == device.name) return devicePath(device, "C0", "d1");
        }
        return {};
    }
};

TEST_F(ServeFailures, WithoutNewPathsNothingIsReturned) {
    answerNull(Entry::NewObjectPath);
    for (const std::string& className : servedClasses()) {
        for (const Operation& operation : enumerations()) {
            const Response response = operation.ask(client(), pathOf(className));
            EXPECT_EQ(CMPI_RC_OK, response.rc);
            EXPECT_EQ(1, response.doneCalls);
            EXPECT_TRUE(response.paths.empty());
            EXPECT_TRUE(response.instances.empty());
        }
        const Response response = client().getInstance(pathOf(className));
        EXPECT_EQ(CMPI_RC_OK, response.rc);
        EXPECT_EQ(1, response.doneCalls);
        EXPECT_TRUE(response.instances.empty());
    }
}

TEST_F(ServeFailures, APathThatCannotBeMadeLosesOneRecordOnly) {
    for (const std::string& className : servedClasses()) {
        answerNull(Entry::NewObjectPath, true);
        EXPECT_EQ(recordsOf(className) - 1,
                  client().enumerateInstanceNames(className).paths.size());
        answerNull(Entry::NewObjectPath, true);
        EXPECT_EQ(recordsOf(className) - 1,
                  client().enumerateInstances(className).instances.size());
    }
}

TEST_F(ServeFailures, WithoutNewInstancesNothingIsReturned) {
    answerNull(Entry::NewInstance);
    for (const std::string& className : servedClasses()) {
        EXPECT_EQ(recordsOf(className), client().enumerateInstanceNames(className).paths.size());
        const Response response = client().enumerateInstances(className, {{"Caption"}});
        EXPECT_EQ(CMPI_RC_OK, response.rc);
        EXPECT_EQ(1, response.doneCalls);
        EXPECT_TRUE(response.instances.empty());
        EXPECT_TRUE(client().getInstance(pathOf(className), {{"Caption"}}).instances.empty());
    }
}

TEST_F(ServeFailures, AnInstanceThatCannotBeMadeLosesOneRecordOnly) {
    for (const std::string& className : servedClasses()) {
        answerNull(Entry::NewInstance, true);
        EXPECT_EQ(recordsOf(className) - 1,
                  client().enumerateInstances(className).instances.size());
    }
}

TEST_F(ServeFailures, RefreshesAreAskedForAllTheSame) {
    answerNull(Entry::NewObjectPath);
    for (const DeviceClass& device : kDeviceClasses) {
        CapturedSyslog::clear();
        client().enumerateInstances(device.name);
        const std::vector<std::string> expected = {refreshRequest("C0", device.action),
                                                   refreshRequest("C1", device.action)};
        EXPECT_EQ(expected, refreshRequests());
    }
}

TEST_F(ServeFailures, WithoutNewArraysInstancesLackTheArraysOnly) {
    answerNull(Entry::NewArray);
    for (const std::string& className : servedClasses()) {
        const Response response = client().enumerateInstances(className);
        EXPECT_EQ(CMPI_RC_OK, response.rc);
        ASSERT_EQ(recordsOf(className), response.instances.size());
        for (const testbed::Instance& instance : response.instances) {
            EXPECT_NE("<absent>", property(instance, "ElementName"));
            EXPECT_EQ("<absent>", property(instance, "OperationalStatus"));
        }
    }
}

TEST_F(ServeFailures, StatusesOfTheBrokerAreNotLookedAt) {
    for (const Entry entry :
         {Entry::InstanceSetProperty, Entry::InstanceSetPropertyFilter, Entry::ArraySetElementAt,
          Entry::PathAddKey, Entry::ResultReturnInstance, Entry::ResultReturnObjectPath,
          Entry::ResultReturnDone}) {
        faults().add(refusal(entry));
    }
    for (const std::string& className : servedClasses()) {
        for (const Operation& operation : allOperations()) {
            const Response response = operation.ask(client(), pathOf(className));
            EXPECT_EQ(CMPI_RC_OK, response.rc) << operation.name << " of " << className;
            EXPECT_FALSE(response.message);
        }
    }
}

TEST_F(ServeFailures, ARefusedRecordDoesNotEndTheWalk) {
    books().recordObjectCalls(true);
    faults().add(refusal(Entry::ResultReturnInstance));
    client().enumerateInstances("Tovexa_PlexorBattery");
    EXPECT_EQ(4u, books().count(Entry::ResultReturnInstance));
}

TEST_F(ServeFailures, ARequestPathWithoutNamespaceTextIsServed) {
    answerNull(Entry::PathGetNameSpace);
    for (const std::string& className : servedClasses()) {
        EXPECT_EQ(recordsOf(className), client().enumerateInstances(className).instances.size());
    }
}

TEST_F(ServeFailures, ARequestPathWithoutClassNameIsUnsupported) {
    answerNull(Entry::PathGetClassName);
    for (const Operation& operation : enumerations()) {
        const Response response = operation.ask(client(), pathOf(kController));
        EXPECT_EQ(CMPI_RC_OK, response.rc);
        EXPECT_EQ(1, response.doneCalls);
        EXPECT_TRUE(response.instances.empty());
    }
    EXPECT_EQ(CMPI_RC_ERR_INVALID_CLASS, client().getInstance(pathOf(kController)).rc);
}

TEST_F(ServeFailures, AKeyThatCannotBeCopiedIsAddedAsNull) {
    const FailAllocation fault = FailAllocation::strdupOf("tvxPortC0_d1");
    const Response response = client().enumerateInstanceNames("Tovexa_PlexorSASSATAPort");
    EXPECT_EQ(CMPI_RC_OK, response.rc);
    ASSERT_EQ(4u, response.paths.size());
    const testbed::CimValue* key = response.paths[0].findKey("DeviceID");
    ASSERT_NE(nullptr, key);
    EXPECT_TRUE(key->isNull);
    EXPECT_EQ(4u, response.paths[0].keys.size());
    EXPECT_EQ("tvxPortC0_d2", response.paths[1].findKey("DeviceID")->asString());
    EXPECT_TRUE(logged(LOG_WARNING, "strdup() failed to duplicate string tvxPortC0_d1\n"));
    // The record is served without the key; its properties do not depend on it.
    EXPECT_EQ("Port d1 on Controller C0",
              property(client().enumerateInstances("Tovexa_PlexorSASSATAPort").instances.at(0),
                       "ElementName"));
}

TEST_F(ServeFailures, AControllersKeyThatCannotBeCopiedIsAddedAsNull) {
    const FailAllocation fault = FailAllocation::strdupOf("tvxControllerC1");
    const Response response = client().enumerateInstanceNames(kController);
    ASSERT_EQ(2u, response.paths.size());
    EXPECT_TRUE(response.paths[1].findKey("Name")->isNull);
    EXPECT_TRUE(logged(LOG_WARNING, "strdup() failed to duplicate string tvxControllerC1\n"));
}

TEST_F(ServeFailures, AGetWithoutMemoryForTheKeyIsAnInvalidPath) {
    for (const std::string& className : servedClasses()) {
        const bool isDevice = recordsOf(className) == 4;
        for (size_t failing = 1; failing <= (isDevice ? 2u : 1u); failing++) {
            CapturedSyslog::clear();
            const FailAllocation fault = FailAllocation::nth(failing, Allocator::Malloc);
            const Response response = client().getInstance(pathOf(className));
            EXPECT_EQ(1u, fault.failures());
            EXPECT_EQ(CMPI_RC_ERR_NOT_FOUND, response.rc);
            EXPECT_FALSE(response.message);
            EXPECT_EQ(0, response.doneCalls);
            const std::vector<std::string> errors = {
                "malloc failure\n", "Object path " + pathOf(className).text() + " invalid\n"};
            EXPECT_EQ(errors, CapturedSyslog::linesAt(LOG_ERR));
            EXPECT_TRUE(refreshRequests().empty());
        }
    }
}

}  // namespace
}  // namespace plexortest
