// A vendor that changes with its scenario is in the end the one that the new scenario alone makes.
#include "placed_vendor.h"

#include <algorithm>

#include "vendor_fixture.h"

namespace testbed {
namespace {

constexpr const char* kNamespaces[] = {"root/sample", "root/interop", "root/cimv2"};

/// Every object and every association as a line, sorted.
std::vector<std::string> contentsOf(const Repository& repository) {
    std::vector<std::string> lines;
    const auto add = [&](const std::vector<Instance>& instances) {
        for (const Instance& instance : instances) {
            std::string line = instance.path.text();
            for (const auto& [name, value] : instance.properties) {
                line += " " + name + "=" + value.text();
            }
            lines.push_back(line);
        }
    };
    for (const char* nameSpace : kNamespaces) {
        for (const char* root : {"CIM_ManagedElement", "CIM_Dependency", "CIM_Component",
                                 "CIM_ElementConformsToProfile", "CIM_LogicalIdentity",
                                 "CIM_ElementSettingData", "CIM_Container"}) {
            add(repository.enumerate(nameSpace, root));
            add(repository.associationInstances(nameSpace, root));
        }
    }
    std::sort(lines.begin(), lines.end());
    return lines;
}

constexpr const char* kPool = R"({"id": "P"})";
constexpr const char* kEnclosure = R"({"number": 1})";
constexpr const char* kDrives = R"({"id": "a", "pool": "P", "slot": 4, "enclosure": 1},
    {"id": "b", "pool": "P", "slot": 5, "enclosure": 1, "firmware": "1"}, {"id": "c"})";
constexpr const char* kRest = R"(, "volumes": [{"id": "v", "pool": "P", "raid": "RAID1"}],
    "ports": [{"id": "0"}], "batteries": [{"id": "0"}], "others": [{"id": "fan"}])";

class PlacedVendorTest : public VendorTest {
protected:
    /// One array "C0", and what is beside the list of controllers.
    static Scenario with(const std::string& pools, const std::string& enclosures,
                         const std::string& drives, const std::string& rest = kRest,
                         const std::string& beside = "") {
        return parseScenario(R"({"controllers": [{"id": "C0", "pools": [)" + pools +
                                 R"(], "enclosures": [)" + enclosures + R"(], "drives": [)" +
                                 drives + "]" + rest + "}]" + beside + "}",
                             "test.json");
    }

    /// Goes from one to the other and back, and has to end up as if it had begun there.
    static void expectChange(const Scenario& one, const Scenario& other) {
        Repository changed;
        buildVendor(changed, one);
        PlacedVendor vendor(changed, one);
        vendor.change(one, other);
        Repository built;
        buildVendor(built, other);
        EXPECT_EQ(contentsOf(changed), contentsOf(built));
        vendor.change(other, one);
        Repository again;
        buildVendor(again, one);
        EXPECT_EQ(contentsOf(changed), contentsOf(again));
    }

    const Scenario usual_ = with(kPool, kEnclosure, kDrives);
};

TEST_F(PlacedVendorTest, ThingsComeAndGo) {
    expectChange(usual_, with(kPool, kEnclosure, R"({"id": "c"})"));
    expectChange(usual_, with(kPool, kEnclosure, R"({"id": "new"}, )" + std::string(kDrives)));
    expectChange(usual_, with(kPool, "", R"({"id": "b"}, {"id": "a"})", ""));
    expectChange(usual_, parseScenario(R"({"controllers": []})", "test.json"));
    expectChange(usual_, parseScenario(R"({"controllers": [{"id": "C1"}, {"id": "C0"}]})", "t"));
}

TEST_F(PlacedVendorTest, ValuesChange) {
    expectChange(usual_, with(kPool, kEnclosure, R"({"id": "a", "state": "failed"}, {"id": "b"})"));
    expectChange(usual_, with(kPool, kEnclosure, kDrives,
                              R"(, "volumes": [{"id": "v", "pool": "P", "raid": "RAID6"}],
                                 "ports": [{"id": "0", "status": "error"}], "model": "M2",
                                 "batteries": [{"id": "0", "state": "dead"}])"));
}

// What drives, volumes and profiles are tied to has another name: they have not changed themselves.
TEST_F(PlacedVendorTest, WhatOthersAreTiedToGetsAnotherName) {
    expectChange(usual_, with(R"({"id": "P", "class": "Sample_Odd"})", kEnclosure, kDrives));
    expectChange(usual_, with(kPool, R"({"number": 1, "tag": "T"})", kDrives));
    expectChange(usual_, with(kPool, kEnclosure, kDrives,
                              std::string(kRest) + R"(, "system": {"class": "Sample_Odd"})"));
    expectChange(usual_, with(kPool, kEnclosure, kDrives,
                              std::string(kRest) + R"(, "class": "Sample_Odd")"));
}

TEST_F(PlacedVendorTest, ProfilesChange) {
    expectChange(usual_, with(kPool, kEnclosure, kDrives, kRest,
                              R"(, "profiles": [{"name": "Host Hardware RAID Controller"}])"));
}

TEST_F(PlacedVendorTest, ASlotThatTwoDrivesNameStaysForTheOther) {
    const char* shared = R"({"id": "a", "slot": 4, "enclosure": 1},
                            {"id": "b", "slot": 4, "enclosure": 1})";
    expectChange(with(kPool, kEnclosure, R"({"id": "b", "slot": 4, "enclosure": 1})"),
                 with(kPool, kEnclosure, R"({"id": "a", "slot": 4, "enclosure": 1})"));
    Scenario both = with(kPool, kEnclosure, shared);
    const Scenario one = with(kPool, kEnclosure, R"({"id": "b", "slot": 4, "enclosure": 1})");
    Repository changed;
    buildVendor(changed, both);
    PlacedVendor(changed, both).change(both, one);
    const Naming names(one.vendor, one.host);
    const ControllerDescription& controller = one.controllers.at(0);
    EXPECT_TRUE(changed.get(names.driveSlot(controller, controller.drives.at(0))));
}

}  // namespace
}  // namespace testbed
