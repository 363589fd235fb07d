// A broker over a small repository, inside a manager call, for the tests of its tables.
#pragma once

#include <cmpidt.h>
#include <cmpift.h>
#include <gtest/gtest.h>

#include <optional>
#include <string>

#include "broker.h"

namespace testbed {

/// What a call wrote to its status parameter; starts with a code that no call answers.
inline CMPIStatus unsetStatus() {
    return {CMPI_RC_ERROR, nullptr};
}

inline const char* textOf(const CMPIString* string) {
    return string->ft->getCharPtr(string, nullptr);
}

inline CMPIValue* asValue(const void* variable) {
    return static_cast<CMPIValue*>(const_cast<void*>(variable));
}

class BrokerTest : public testing::Test {
protected:
    explicit BrokerTest(BrokerOptions options = {}) : broker(repository, std::move(options)) {
        defineClasses();
        enterCall();
    }

    /// Classes of root/sample: a drive below a device, a fan beside it, two associations.
    void defineClasses() {
        using Definitions = std::vector<PropertyDefinition>;
        const Definitions deviceProperties = {
            {"DeviceID", CMPI_string, true, "CIM_Device", {}},
            {"EnabledState", CMPI_uint16, false, "CIM_Device", CimValue::uint16(5)},
            {"OperationalStatus", CMPI_uint16A, false, "CIM_Device", {}},
        };
        const Definitions driveProperties = {
            {"Capacity", CMPI_uint64, false, "CIM_Drive", {}},
            {"Removable", CMPI_boolean, false, "CIM_Drive", {}},
        };
        repository.defineClass("root/sample", {"CIM_Device", "", deviceProperties});
        repository.defineClass("root/sample", {"CIM_Drive", "CIM_Device", driveProperties});
        repository.defineClass("root/sample", {"Sample_Drive", "CIM_Drive", {}});
        repository.defineClass("root/sample", {"CIM_Fan", "CIM_Device", {}});
        repository.defineClass("root/sample", {"CIM_Dependency", "", {}});
        repository.defineClass("root/sample", {"CIM_Cooling", "CIM_Dependency", {}});
    }

    void enterCall() { scope.emplace(broker); }
    void leaveCall() { scope.reset(); }
    const CMPIContext* context() const { return scope->context(); }

    const CMPIBroker* handle() const { return broker.handle(); }
    const CMPIBrokerFT& calls() const { return *handle()->bft; }
    const CMPIBrokerEncFT& makers() const { return *handle()->eft; }

    static ObjectPath drivePath(const std::string& id) {
        return ObjectPath{"root/sample", "Sample_Drive", {}}.key("DeviceID", CimValue::string(id));
    }
    static ObjectPath fanPath(const std::string& id) {
        return ObjectPath{"root/sample", "CIM_Fan", {}}.key("DeviceID", CimValue::string(id));
    }
    static Instance drive(const std::string& id) {
        return Instance{drivePath(id), {}}.set("DeviceID", CimValue::string(id));
    }
    static Instance fan(const std::string& id) {
        return Instance{fanPath(id), {}}.set("DeviceID", CimValue::string(id));
    }
    void cool(const std::string& driveId, const std::string& fanId) {
        repository.associate("CIM_Cooling", {"Antecedent", fanPath(fanId)},
                             {"Dependent", drivePath(driveId)});
    }
    CMPIObjectPath* classPath(const std::string& name, const std::string& space = "root/sample") {
        return broker.makePath({space, name, {}});
    }

    std::vector<std::string> misuses() { return broker.books().misuses(); }
    void expectMisuse(const std::string& part) {
        ASSERT_EQ(misuses().size(), 1u);
        EXPECT_NE(misuses().front().find(part), std::string::npos) << misuses().front();
    }

    Repository repository;
    Broker broker;
    std::optional<Broker::CallScope> scope;
};

}  // namespace testbed
