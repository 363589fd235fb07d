#include "repository.h"

#include <gtest/gtest.h>

#include <set>

namespace testbed {
namespace {

const char* const space = "root/sample";

ObjectPath path(const std::string& className, const std::string& id,
                const std::string& nameSpace = space) {
    return ObjectPath{nameSpace, className, {}}.key("DeviceID", CimValue::string(id));
}

std::vector<std::string> idsOf(const std::vector<Instance>& instances) {
    std::vector<std::string> ids;
    for (const Instance& instance : instances) {
        ids.push_back(instance.path.findKey("DeviceID")->asString());
    }
    return ids;
}

using Ids = std::vector<std::string>;

class RepositoryTest : public testing::Test {
protected:
    RepositoryTest() {
        repository.defineClass(space, {"CIM_Device",
                                       "",
                                       {{"DeviceID", CMPI_string, true, "CIM_Device", {}},
                                        {"Status", CMPI_uint16, false, "CIM_Device", {}}}});
        repository.defineClass(
            space, {"CIM_Drive", "CIM_Device", {{"Slot", CMPI_uint16, false, "CIM_Drive", {}}}});
        repository.defineClass(
            space,
            {"Sample_Drive", "cim_drive", {{"status", CMPI_uint32, false, "Sample_Drive", {}}}});
        repository.defineClass(space, {"CIM_Fan", "CIM_Device", {}});
        repository.defineClass(space, {"CIM_Dependency", "", {}});
        repository.defineClass(space, {"CIM_Cooling", "CIM_Dependency", {}});
        repository.defineClass("root/interop", {"CIM_Profile", "", {}});
    }
    void put(const ObjectPath& instance) { repository.put(Instance{instance, {}}); }
    void cool(const ObjectPath& cooler, const ObjectPath& cooled) {
        repository.associate("CIM_Cooling", {"Antecedent", cooler}, {"Dependent", cooled});
    }

    Repository repository;
    const ObjectPath fan = path("CIM_Fan", "F");
    const ObjectPath drive = path("Sample_Drive", "D");
};

TEST_F(RepositoryTest, ClassesAndNamespacesWithoutCase) {
    EXPECT_TRUE(repository.hasNamespace("ROOT/Sample"));
    EXPECT_FALSE(repository.hasNamespace("root/other"));
    EXPECT_TRUE(repository.hasClass(space, "cim_FAN"));
    EXPECT_FALSE(repository.hasClass("root/interop", "CIM_Fan"));
    EXPECT_EQ(repository.findClass(space, "sample_drive")->name, "Sample_Drive");
    EXPECT_FALSE(repository.findClass(space, "CIM_Tape").has_value());
    EXPECT_EQ(repository.classNames(space).size(), 6u);
}

TEST_F(RepositoryTest, IsAFollowsTheHierarchy) {
    EXPECT_TRUE(repository.isA(space, "Sample_Drive", "cim_device"));
    EXPECT_TRUE(repository.isA(space, "Sample_Drive", "Sample_Drive"));
    EXPECT_FALSE(repository.isA(space, "CIM_Device", "Sample_Drive"));
    EXPECT_FALSE(repository.isA(space, "Unknown", "Unknown"));
    EXPECT_FALSE(repository.isA("root/other", "CIM_Drive", "CIM_Device"));
}

TEST_F(RepositoryTest, HierarchyThatBitesItsTailEnds) {
    repository.defineClass(space, {"Loop_A", "Loop_B", {}});
    repository.defineClass(space, {"Loop_B", "Loop_A", {}});
    EXPECT_TRUE(repository.isA(space, "Loop_A", "Loop_B"));
    EXPECT_FALSE(repository.isA(space, "Loop_A", "CIM_Device"));
}

TEST_F(RepositoryTest, InheritedPropertiesComeFirstAndCanBeRedefined) {
    const auto properties = repository.allProperties(space, "Sample_Drive");
    ASSERT_EQ(properties.size(), 3u);
    EXPECT_EQ(properties[0].name, "DeviceID");
    EXPECT_EQ(properties[1].type, CMPI_uint32);
    EXPECT_EQ(properties[2].name, "Slot");
    EXPECT_EQ(repository.findProperty(space, "Sample_Drive", "Status")->type, CMPI_uint32);
    EXPECT_EQ(repository.findProperty(space, "CIM_Fan", "Status")->type, CMPI_uint16);
    EXPECT_FALSE(repository.findProperty(space, "CIM_Fan", "Slot").has_value());
}

TEST_F(RepositoryTest, PutReplacesInPlace) {
    put(path("CIM_Drive", "1"));
    put(path("CIM_Drive", "2"));
    repository.put(Instance{path("cim_drive", "1"), {}}.set("Slot", CimValue::uint16(9)));
    EXPECT_EQ(idsOf(repository.enumerate(space, "CIM_Drive")), (Ids{"1", "2"}));
    EXPECT_EQ(repository.get(path("CIM_Drive", "1"))->find("Slot")->asUnsigned(), 9u);
}

TEST_F(RepositoryTest, RemoveKeepsTheOthersReachable) {
    for (const char* id : {"1", "2", "3"}) put(path("CIM_Drive", id));
    EXPECT_TRUE(repository.remove(path("CIM_Drive", "2")));
    EXPECT_FALSE(repository.remove(path("CIM_Drive", "2")));
    EXPECT_FALSE(repository.get(path("CIM_Drive", "2")).has_value());
    EXPECT_EQ(repository.get(path("CIM_Drive", "3"))->path, path("CIM_Drive", "3"));
    EXPECT_EQ(idsOf(repository.enumerate(space, "CIM_Device")), (Ids{"1", "3"}));
}

TEST_F(RepositoryTest, EnumerateIncludesSubclassesOnlyInTheNamespace) {
    put(drive);
    put(fan);
    put(path("CIM_Drive", "elsewhere", "root/interop"));
    EXPECT_EQ(idsOf(repository.enumerate(space, "CIM_Device")), (Ids{"D", "F"}));
    EXPECT_EQ(idsOf(repository.enumerate(space, "CIM_Drive")), (Ids{"D"}));
}

TEST_F(RepositoryTest, PropertiesChangeInPlace) {
    put(drive);
    EXPECT_TRUE(repository.setProperty(drive, "Slot", CimValue::uint16(4)));
    EXPECT_EQ(repository.get(drive)->find("slot")->asUnsigned(), 4u);
    EXPECT_TRUE(repository.eraseProperty(drive, "SLOT"));
    EXPECT_EQ(repository.get(drive)->find("Slot"), nullptr);
    EXPECT_FALSE(repository.setProperty(fan, "Slot", CimValue::uint16(4)));
    EXPECT_FALSE(repository.eraseProperty(fan, "Slot"));
}

TEST_F(RepositoryTest, AssociatorsFromEitherEnd) {
    put(drive);
    put(fan);
    cool(fan, drive);
    EXPECT_EQ(idsOf(repository.associators(fan, {})), (Ids{"D"}));
    EXPECT_EQ(idsOf(repository.associators(drive, {})), (Ids{"F"}));
}

TEST_F(RepositoryTest, AssociatorsFilterByClassesAndRoles) {
    put(drive);
    put(fan);
    cool(fan, drive);
    const auto count = [&](const AssociationFilter& filter) {
        return repository.associators(drive, filter).size();
    };
    EXPECT_EQ(count({"cim_dependency", "CIM_Device", "dependent", "ANTECEDENT"}), 1u);
    EXPECT_EQ(count({"CIM_Cooling", {}, {}, {}}), 1u);
    EXPECT_EQ(count({"CIM_Device", {}, {}, {}}), 0u);
    EXPECT_EQ(count({{}, "CIM_Drive", {}, {}}), 0u);
    EXPECT_EQ(count({{}, {}, "Antecedent", {}}), 0u);
    EXPECT_EQ(count({{}, {}, {}, "Dependent"}), 0u);
    EXPECT_EQ(count({"CIM_Unknown", {}, {}, {}}), 0u);
    EXPECT_EQ(count({{}, "CIM_Unknown", {}, {}}), 0u);
}

TEST_F(RepositoryTest, AssociationsOfAnUndefinedClassAreNotFoundByItsName) {
    put(drive);
    put(fan);
    repository.associate("CIM_Undefined", {"A", fan}, {"B", drive});
    EXPECT_TRUE(repository.associators(fan, {"CIM_Undefined", {}, {}, {}}).empty());
}

TEST_F(RepositoryTest, SourceNeedsAllItsKeysAndAKnownClass) {
    put(drive);
    put(fan);
    cool(fan, drive);
    EXPECT_TRUE(repository.associators({space, "CIM_Fan", {}}, {}).empty());
    const ObjectPath stranger = path("CIM_Stranger", "S");
    cool(stranger, drive);
    EXPECT_TRUE(repository.associators(stranger, {}).empty());
}

TEST_F(RepositoryTest, DanglingAndDoubleResultsAreLeftOut) {
    put(drive);
    cool(fan, drive);
    EXPECT_TRUE(repository.associators(drive, {}).empty());
    EXPECT_TRUE(repository.references(drive, "", "").empty());
    put(fan);
    cool(fan, drive);
    EXPECT_EQ(idsOf(repository.associators(drive, {})), (Ids{"F"}));
    EXPECT_EQ(repository.references(drive, "", "").size(), 2u);
}

TEST_F(RepositoryTest, AssociationsCrossNamespaces) {
    const ObjectPath profile = path("CIM_Profile", "P", "root/interop");
    put(profile);
    put(fan);
    cool(profile, fan);
    EXPECT_EQ(idsOf(repository.associators(profile, {"CIM_Dependency", "CIM_Fan", {}, {}})),
              (Ids{"F"}));
    EXPECT_EQ(idsOf(repository.associators(fan, {"CIM_Cooling", "CIM_Profile", {}, {}})),
              (Ids{"P"}));
}

TEST_F(RepositoryTest, ReferencesCarryBothEnds) {
    put(drive);
    put(fan);
    cool(fan, drive);
    const auto references = repository.references(drive, "CIM_Dependency", "Dependent");
    ASSERT_EQ(references.size(), 1u);
    EXPECT_EQ(references[0].path.className, "CIM_Cooling");
    EXPECT_EQ(*references[0].find("Antecedent"), CimValue::reference(fan));
    EXPECT_EQ(*references[0].path.findKey("Dependent"), CimValue::reference(drive));
    EXPECT_TRUE(repository.references(drive, "", "Antecedent").empty());
    EXPECT_TRUE(repository.references(drive, "CIM_Device", "").empty());
}

TEST_F(RepositoryTest, DissociateByClassOrSuperclassInAnyOrder) {
    put(drive);
    put(fan);
    cool(fan, drive);
    cool(fan, drive);
    EXPECT_EQ(repository.dissociate("CIM_Device", fan, drive), 0u);
    EXPECT_EQ(repository.dissociate("CIM_Dependency", drive, fan), 2u);
    EXPECT_TRUE(repository.associators(fan, {}).empty());
}

TEST_F(RepositoryTest, WhatIsDissociatedLeavesTheOthersWhereTheyAre) {
    const ObjectPath second = path("Sample_Drive", "D2");
    put(drive);
    put(second);
    put(fan);
    cool(fan, drive);
    cool(fan, second);
    EXPECT_EQ(repository.dissociate("CIM_Dependency", fan, drive), 1u);
    EXPECT_TRUE(repository.associators(drive, {}).empty());
    ASSERT_EQ(repository.associators(fan, {}).size(), 1u);
    EXPECT_EQ(repository.associators(fan, {})[0].path.identity(), second.identity());
    ASSERT_EQ(repository.associators(second, {}).size(), 1u);
    EXPECT_EQ(repository.associators(second, {})[0].path.identity(), fan.identity());
}

TEST_F(RepositoryTest, ResultsKeepTheirOrderUntilShuffled) {
    Ids inOrder;
    put(fan);
    for (int number = 0; number < 20; ++number) {
        const ObjectPath each = path("CIM_Drive", std::to_string(number));
        put(each);
        cool(fan, each);
        inOrder.push_back(std::to_string(number));
    }
    EXPECT_EQ(idsOf(repository.associators(fan, {})), inOrder);

    repository.shuffleResults(7);
    const Ids first = idsOf(repository.associators(fan, {}));
    const Ids second = idsOf(repository.associators(fan, {}));
    EXPECT_NE(first, inOrder);
    EXPECT_NE(first, second);
    EXPECT_EQ(std::set<std::string>(first.begin(), first.end()),
              std::set<std::string>(inOrder.begin(), inOrder.end()));
}

TEST_F(RepositoryTest, ClearKeepsClasses) {
    put(drive);
    put(fan);
    cool(fan, drive);
    repository.clearInstances();
    EXPECT_TRUE(repository.enumerate(space, "CIM_Device").empty());
    put(drive);
    put(fan);
    EXPECT_TRUE(repository.associators(fan, {}).empty());
    EXPECT_TRUE(repository.hasClass(space, "CIM_Fan"));
}

}  // namespace
}  // namespace testbed
