// A vendor built from a scenario text, and short ways to walk it.
#pragma once

#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

#include "naming.h"
#include "scenario_parser.h"
#include "vendor.h"
#include "vendor_graphs.h"

namespace testbed {

class VendorTest : public ::testing::Test {
protected:
    void build(const std::string& text) {
        scenario = parseScenario(text, "test.json");
        buildVendor(repository, scenario);
    }

    /// One controller "C0" with these further members.
    void buildController(const std::string& members) {
        build(R"({"controllers": [{"id": "C0", "model": "M1")" +
              (members.empty() ? "" : ", " + members) + "}]}");
    }

    Naming naming() const { return Naming(scenario.vendor, scenario.host); }
    const ControllerDescription& controller() const { return scenario.controllers.at(0); }
    ObjectPath system() const { return naming().system(controller()); }
    ObjectPath portController() const { return naming().portController(controller()); }

    std::vector<Instance> walk(const ObjectPath& source, const char* assocClass,
                               const char* resultClass = nullptr) const {
        AssociationFilter filter;
        filter.assocClass = assocClass;
        if (resultClass) filter.resultClass = resultClass;
        return repository.associators(source, filter);
    }

    /// The only result of a walk; fails the test when there is not exactly one.
    Instance only(const ObjectPath& source, const char* assocClass,
                  const char* resultClass = nullptr) const {
        const std::vector<Instance> found = walk(source, assocClass, resultClass);
        EXPECT_EQ(found.size(), 1u) << assocClass << " from " << source.text();
        return found.empty() ? Instance{} : found.front();
    }

    std::vector<Instance> devices(const char* resultClass) const {
        return walk(system(), "CIM_SystemDevice", resultClass);
    }

    Repository repository;
    Scenario scenario;
};

/// The value as text; "<absent>" when the instance lacks the property.
inline std::string valueOf(const Instance& instance, const char* property) {
    const CimValue* value = instance.find(property);
    return value ? value->text() : "<absent>";
}

inline CMPIType typeOf(const Instance& instance, const char* property) {
    const CimValue* value = instance.find(property);
    return value ? value->type : CMPIType(CMPI_null);
}

inline std::string keyOf(const Instance& instance, const char* key) {
    const CimValue* value = instance.path.findKey(key);
    return value ? value->text() : "<absent>";
}

}  // namespace testbed
